#include <gtest/gtest.h>

#include <cmath>
#include <ctime>
#include <limits>

#include "TemporaryFolder.h"
#include "util/CharacterBuffer.h"
#include "util/Dates.h"
#include "util/File.h"
#include "util/Numbers.h"
#include "util/Strings.h"
#include "util/Utf8.h"

namespace {

// The text that is left of one in a long buffer.
template <class Change>
std::string Left(const Change& change, std::string text = "") {
    text.resize(128);
    change(text.data());
    return text.c_str() + std::string("|");
}

TEST(Strings, AreChangedInPlace) {
    EXPECT_EQ(Left(Trim, "  a b \n \n") + Left(Trim, "   ") + Left(Trim, "abc\t\r\n"), "  a b||abc\t\r|");
    // The first byte beyond ASCII ends the changing of letters.
    EXPECT_EQ(Left(strlwr, "ABC[Z@`{") + Left(strlwr, "A\xC3\x84Z"), "abc[z@`{|a\xC3\x84Z|");
    EXPECT_EQ(Left(strupr, "abc`z{@[") + Left(strupr, "a\xC3\xA4z"), "ABC`Z{@[|A\xC3\xA4z|");
    EXPECT_EQ(Left([](char* text) { ReplaceCharacter(text, '/', '_'); }, "a/b/"), "a_b_|");
}

TEST(Strings, CompareWithoutLetterCase) {
    const std::string start(200, 'x');
    EXPECT_EQ(strcmpi((start + "A\xC3\xA4").c_str(), (start + "a\xC3\xA4").c_str()), 0);
    // As lower case, not as upper case, and as unsigned bytes.
    std::string before = start;
    for (const char* end : {"_", "a", "ab", "ABC", "b", "Z", "\xC3\xA4X", "\xC3\xA4x"}) {
        const std::string next = start + end;
        EXPECT_LT(strcmpi(before.c_str(), next.c_str()), 0) << end;
        EXPECT_GT(strcmpi(next.c_str(), before.c_str()), 0) << end;
        before = next;
    }
}

// What is kept of the text in no byte, in one, and so on.
std::string Cuts(const std::string& text) {
    std::string all;
    for (std::size_t bytes = 0; bytes <= text.size(); ++bytes) {
        const std::string kept(CutToBytes(text, bytes));
        all.append(kept).append("|");
        std::string copied(16, '#'), formatted(16, '#');
        EXPECT_EQ(CopyText(copied.data(), bytes + 1, text), bytes == text.size());
        EXPECT_EQ(FormatInto(formatted.data(), bytes + 1, "%s", text.c_str()), bytes == text.size());
        EXPECT_EQ(copied.c_str() + copied.substr(bytes + 1), kept + std::string(15 - bytes, '#'));
        EXPECT_EQ(formatted.c_str() + formatted.substr(bytes + 1), kept + std::string(15 - bytes, '#'));
    }
    return all;
}

TEST(CharacterBuffer, CutsBetweenWholeCharacters) {
    EXPECT_EQ(Cuts("ab"), "|a|ab|");
    EXPECT_EQ(Cuts("\xC3\xA4!"), "||\xC3\xA4|\xC3\xA4!|");
    EXPECT_EQ(Cuts("\xE2\x82\xAC!"), "|||\xE2\x82\xAC|\xE2\x82\xAC!|");
    EXPECT_EQ(Cuts("x\xF0\x9F\x92\xB0y"), "|x|x|x|x|x\xF0\x9F\x92\xB0|x\xF0\x9F\x92\xB0y|");
    EXPECT_EQ(Cuts("\x80\x80\x80\x80\x80").substr(10), "\x80\x80\x80\x80|\x80\x80\x80\x80\x80|"); // no UTF-8
    char field[4] = {'a', 'b', 'c', 'd'};
    EXPECT_FALSE(CopyText(field, 0, "x") || FormatInto(field, 0, "x"));
    EXPECT_EQ(FieldText(field), "abcd"); // a field may lack its end
    EXPECT_TRUE(CopyTextZeroed(field, "x"));
    EXPECT_EQ(std::string(field, sizeof field), std::string("x\0\0\0", 4));
}

// The bytes as they are shown, and the cells that this takes.
std::string Shown(const char* bytes) {
    std::string escaped;
    AppendEscaped(escaped, bytes);
    return escaped + " " + std::to_string(DisplayWidth(escaped));
}

TEST(Utf8, StaysOnItsLineAndCanBeTurnedBack) {
    EXPECT_EQ(Shown("a\tb\nc\rd\\e\x1B[~\x7F"), "a\\tb\\nc\\rd\\\\e\\x1B[~\\x7F 23");
    EXPECT_EQ(Shown("\xC3\xA4\xE0\xA0\x80\xF0\x90\x80\x80"), "\xC3\xA4\xE0\xA0\x80\xF0\x90\x80\x80 3");
    EXPECT_EQ(Shown("\xE6\x97\xA5 e\xCC\x81"), "\xE6\x97\xA5 e\xCC\x81 4"); // wide, and a combining mark
    // A control character, and one that turns the direction; what is no UTF-8, overlong or beyond Unicode.
    EXPECT_EQ(Shown("\xC2\x9B\xE2\x80\xAE"), "\\xC2\\x9B\\xE2\\x80\\xAE 20");
    EXPECT_EQ(Shown("\xFF \xC3 \xC0\x80"), "\\xFF \\xC3 \\xC0\\x80 18");
    EXPECT_EQ(Shown("\xED\xA0\x80\xF4\x90\x80\x80"), "\\xED\\xA0\\x80\\xF4\\x90\\x80\\x80 28");
}

std::string Split(const std::string& path) {
    char dir[PathBufferSize], name[PathBufferSize], extension[PathBufferSize], joined[PathBufferSize];
    _splitpath(path.c_str(), nullptr, dir, name, extension);
    _makepath(joined, nullptr, dir, name, extension);
    return std::string(dir) + "|" + name + "|" + extension + "|" + joined;
}

TEST(Paths, SplitAndJoin) {
    EXPECT_EQ(Split("/opt/app.d/a.b.c"), "/opt/app.d|a.b|c|/opt/app.d/a.b.c");
    EXPECT_EQ(Split("/opt/app.d/README"), "/opt/app.d|README||/opt/app.d/README");
    EXPECT_EQ(Split("invest.db") + Split("dir/"), "|invest|db|/invest.dbdir|||dir/");
    const std::string longDir = "/" + std::string(123, 'd');
    EXPECT_EQ(Split(longDir + "/fn"), longDir + "|fn||" + longDir + "/fn");
    EXPECT_EQ(Split(longDir + "/fnx"), "|||/"); // empty rather than another path
    char joined[PathBufferSize];
    _makepath(joined, nullptr, longDir.c_str(), "fn", "x");
    EXPECT_STREQ(joined, "");
}

TEST(DebugLog, AppendsAsGivenAndClears) {
    const TemporaryFolder folder;
    const std::string log = folder.File("log");
    PrintDebugStatement("100% %s\n", log.c_str());
    PrintDebugStatement("CLEARX", log.c_str());
    EXPECT_EQ(std::filesystem::status(log).permissions(), std::filesystem::perms{0600});
    EXPECT_EQ(folder.Read("log"), "100% %s\nCLEARX");
    PrintDebugStatement("CLEAR", log.c_str());
    EXPECT_EQ(folder.Read("log"), "");
}

std::string Grouped(std::initializer_list<float> values, int decimals) {
    std::string all;
    for (const float value : values)
        all += Left([&](char* text) { FormatNumber(value, text, decimals); });
    return all;
}

TEST(Numbers, GroupsThousands) {
    constexpr float infinity = std::numeric_limits<float>::infinity();
    EXPECT_EQ(Grouped({1234567.0F, -1234.0F, 1234.5F, 12345.5F, -123.0F, 999.999F, -0.001F}, 2),
              "1,234,567.00|-1,234.00|1234.50|12,345.50|-123.00|1000.00|-0.00|");
    EXPECT_EQ(Grouped({0.125F, 0.375F, infinity, -infinity, -std::nanf("")}, 2), "0.12|0.38|inf|-inf|nan|");
    EXPECT_EQ(Grouped({-123456792.0F, 1e13F}, 0), "-123,456,792|9999,999,827,968|");
    EXPECT_EQ(Grouped({1e27F, 1e29F, -std::numeric_limits<float>::max()}, 2),
              "999999988484154753,734,934,528.00|1.00e+29|-3.40e+38|"); // from 32 characters on
    EXPECT_EQ(Grouped({1.0F}, 1000), "1.00000000000000000000e+00|");
    char text[8];
    EXPECT_TRUE(FormatFixed(-12.3456, text, sizeof text, 3));
    EXPECT_STREQ(text, "-12.346");
    EXPECT_FALSE(FormatFixed(12345678, text, sizeof text, 60));
}

TEST(Numbers, ReadsTheNumberAtTheStart) {
    std::vector<double> numbers;
    for (const char* text :
         {"1,234.50", "N/A", "", " \t-3e2x", "+4.", ".5", "12 3/8", "+-4", "inf", "0x1", "1e-999", "-", "1e"})
        EXPECT_TRUE(ReadDecimal(text, &numbers.emplace_back(-1))) << text;
    EXPECT_EQ(numbers, (std::vector<double>{1, 0, 0, -300, 4, 0.5, 12, 0, 0, 0, 0, 0, 1}));
    EXPECT_FALSE(ReadDecimal("-0.5e999", numbers.data()));
    EXPECT_EQ(numbers[0], 0);
}

TEST(Dates, KnowTheCalendar) {
    EXPECT_EQ(CheckDate(2000, 2, 29) + CheckDate(2004, 2, 29) + CheckDate(2001, 4, 30) +
                  CheckDate(2001, 12, 31),
              0);
    EXPECT_EQ(CheckDate(1900, 2, 29) + CheckDate(2001, 2, 29) + CheckDate(2001, 4, 31) +
                  CheckDate(2001, 12, 32) + CheckDate(2001, 13, 1) + CheckDate(2001, 0, 1) +
                  CheckDate(2001, 1, 0),
              7);
    const auto written = [](const char* date, int style) {
        return Left([style](char* text) { EXPECT_EQ(FormatDate(text, text, style), 0); }, date);
    };
    EXPECT_EQ(written("19991231", 0) + written("19991231", 1) + written("20240905", 2) +
                  written("20240905", 3),
              "Dec 31, 1999|12-31-1999|September 05, 2024|20240905|");
    EXPECT_EQ(written("", 0) + written("20241305", 0) + written("20240005", 2) + written("abc", 1),
              "|13 05, 2024|00 05, 2024|00-00-0|");
}

TEST(Dates, TellTheTimeOnATwelveHourClock) {
    for (const auto& [clock, shown] : {std::pair(0, 0), {12, 12}, {13, 1}}) {
        int hour = 0, minute = 0, second = 0;
        std::time_t before = 0;
        do { // again should the clock strike in between
            before = std::time(nullptr);
            // A time zone that far west turns the running clock into any time of day.
            setenv("TZ", ("TST" + std::to_string((before / 3600 - clock) % 24)).c_str(), 1);
            tzset();
            GetTime(&hour, &minute, &second);
        } while (std::time(nullptr) != before);
        EXPECT_EQ(std::tuple(hour, minute, second), std::tuple(shown, before / 60 % 60, before % 60));
    }
    GetDate(nullptr, nullptr, nullptr);
}

} // namespace
