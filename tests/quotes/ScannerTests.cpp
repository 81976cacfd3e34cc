#include <algorithm>
#include <vector>

#include "QuoteTest.h"
#include "quotes/Host.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteScanner.h"
#include "quotes/QuoteSource.h"

namespace {

using namespace std::string_literals;

TEST_F(QuoteTest, ThePriceBehindTheMarkerIsRead) {
    const std::string found = "found tag\nskipped ok\n";
    const std::string longValue(1000, '7');
    const std::tuple<std::vector<std::string>, int, float, std::string> cases[] = {
        {{"a Last</td><td><b>45<sup>3</sup>/<sub>8</sub></b>"}, 3, 45.375F, found + "value string is '45'\n"},
        {{"Last<b>45</b> and support follows"}, 1, NoQuote, found + "value string is '45'\n"},
        {{"Last<b>12 -1/2 </b>"}, 1, NoQuote, found + "value string is '12'\n"},
        {{"last<b>45</b>"}, 1, NoQuote, ""},
        {{"Last Trade 45"}, -5, 0, found + "value string is 'Last'\n"},
        {{"Last</td>45"}, 2, NoQuote, "found tag\n"},
        {{"Last>1,234.50"}, 1, 1, found + "value string is '1,234.50'\n"},
        {{"Last>-1e999"}, 1, NoQuote, found + "value string is '-1e999'\n"},
        {{"Last>inf"}, 1, 0, found + "value string is 'inf'\n"},
        {{"Last>\r\n45"}, 1, 0, found + "value string is '\r'\n"},
        // Of earlier pieces nothing but the marker and the count is known.
        {{"Last</td", "><", ">\n\t ", "<>7"}, 3, 7, found + "value string is '7'\n"},
        {{"Last>", " \t<>", "7"}, 1, 7, found + "value string not found\nskipped ok\nvalue string is '7'\n"},
        {{"La", "st>7", "Last>8"}, 1, 8, found + "value string is '8'\n"},
        {{"Last>45 3/", "8"}, 1, 45, found + "value string is '45'\n"},
        {{"Last>45<sup>3</sup>/<sub>", "16</sub>"}, 1, NoQuote, found + "value string is '45'\n"},
        // Any bytes: a NUL is one of them, but ends the text in which a fraction is looked for.
        {{"\0\xFF\0Last\0>\0 45\0x 1/2"s}, 1, 0, found + "value string is ''\n"},
        {{"\0\xFF\0Last\0>45 \0 1/2"s}, 1, 45, found + "value string is '45'\n"},
        {{"Last>" + longValue}, 1, NoQuote, found + "value string is '" + longValue.substr(0, 109) + "\n"},
    };
    for (const auto& [pieces, skip, price, log] : cases) {
        QuoteReport report(context_.logPath, nullptr);
        QuoteScanner scanner("Last", skip, report);
        static_cast<void>(std::find_if(pieces.begin(), pieces.end(),
                                       [&](const auto& piece) { return scanner.Scan(piece); }));
        EXPECT_EQ(scanner.Price(), price) << pieces[0];
        EXPECT_EQ(Log(), log) << pieces[0];
    }
}

TEST(Fraction, IsReadInBothForms) {
    const std::pair<double, std::vector<std::string>> cases[] = {
        {0.375,
         {"3/8", " 3/8</b>", "3 8", "3/8x", "+3/+8", "SUP>3</SUP>/<SUB>8", "sup x>3 </sup><sub>8</sub>"}},
        {-0.25, {"-1/4"}},
        {1, {"99999999999/99999999999", "-99999999999/-99999999999"}},
        // "/" is no end of the second number, and capitals behind a byte beyond ASCII stay.
        {0, {"", "3 / 8", "x/8", "3/+-8", "3/0", "3/", "\xC3 3<SUP>3/8"}},
        {-1,
         {"support", "sup>3", "sup>3</sup><sub>", "sup>3</sup><sub 8", "sup>3</sup><sub>0</sub>",
          "sub>3</sub><sup>8</sup>"}},
    };
    for (const auto& [fraction, texts] : cases)
        for (std::string text : texts)
            EXPECT_EQ(LookForFraction(text.data()), fraction) << text;
}

std::string Described(QuoteSourceReader& reader) {
    using Line = QuoteSourceReader::Line;
    const Line line = reader.Next();
    const std::string number = std::to_string(reader.LineNumber());
    if (line == Line::EndOfFile || line == Line::EndOfList)
        return line == Line::EndOfFile ? "end of file" : "end of list";
    if (line == Line::Skipped)
        return number + (reader.Problem() ? reader.Problem() : " comment");
    const QuoteSource& s = reader.Source();
    return number + ' ' + s.label + '|' + s.host + '|' + s.path + '|' + s.tag + '|' + std::to_string(s.skip);
}

TEST(QuoteSource, LinesAreReadUpToTheListsEnd) {
    const std::string comment = ";" + std::string(253, 'x') + "\n";
    const std::string label(31, 'l'), host(63, 'h'), path(127, 'p'), tag(31, 't');
    const std::pair<std::string, std::vector<std::string>> cases[] = {
        {";2345678\nnet h /q Last 3\n", {"end of list"}},
        {";23456789\nnet h /q Last 3", {"1 comment", "2 net|h|/q|Last|3", "end of file"}},
        {"net h\t /q \v Last\r+12x more", {"1 net|h|/q|Last|12", "end of file"}},
        {"net h /q Last -99999999999\n", {"1 net|h|/q|Last|-2147483648"}},
        {"net h /q Last three\n", {"1its skip count is no number"}},
        {"net h /q Last \n;23456789\nnet h /q Last 1",
         {"1it has fewer than five fields", "2 comment", "3 net|h|/q|Last|1"}},
        {"net\0h /q Last 3\n"s, {"end of list"}},
        // What is behind the 255th byte is another line, and can be one that ends the list.
        {comment + "net h /q Last 3\n", {"1 comment", "2 net|h|/q|Last|3"}},
        {"x" + comment + "net h /q Last 3\n", {"1its label has more than 31 bytes", "end of list"}},
        {comment.substr(0, 254) + "another h /q Last 3\n" + comment,
         {"1 comment", "1 nother|h|/q|Last|3", "2 comment"}},
        {label + ' ' + host + ' ' + path.substr(7) + ' ' + tag + " 3",
         {"1 " + label + '|' + host + '|' + path.substr(7) + '|' + tag + "|3"}},
        {"l" + label + " h /q Last 3", {"1its label has more than 31 bytes"}},
        {"net h" + host + " /q Last 3", {"1its host has more than 63 bytes"}},
        {"net h p" + path + " Last 3", {"1its path has more than 127 bytes"}},
        {"net h /q t" + tag + " 3", {"1its marker has more than 31 bytes"}},
    };
    for (const auto& [content, lines] : cases) {
        QuoteSourceReader reader(content);
        for (const std::string& line : lines)
            EXPECT_EQ(Described(reader), line) << content;
    }
}

TEST(HostField, NamesAServer) {
    const std::pair<const char*, std::vector<const char*>> cases[] = {
        {"quotes.example 80", {"quotes.example", "http://quotes.example"}},
        {"quotes.example 8080", {"quotes.example:8080", "Http://quotes.example:8080"}},
        {"quotes.example 443 tls", {"https://quotes.example"}},
        {"quotes.example 65535 tls", {"HTTPS://quotes.example:65535"}},
        {"",
         {"quotes.example:", "quotes.example:0", "quotes.example:65536", "quotes.example:80x",
          "quotes.example:+80", ":80", "https://", "http://https://quotes.example", "https://quotes.example/",
          "https://user@quotes.example"}},
    };
    for (const auto& [meaning, texts] : cases)
        for (const char* text : texts) {
            HostField host;
            const bool read = ParseHostField(text, &host);
            EXPECT_EQ(read ? host.name + ' ' + std::to_string(host.port) + (host.tls ? " tls" : "") : "",
                      meaning)
                << text;
        }
}

} // namespace
