#include "tools/CsvReader.h"

#include <algorithm>
#include <csv.h>

namespace {

constexpr std::string_view ByteOrderMark = "\xEF\xBB\xBF";
constexpr std::size_t GroupDigits = 3;

// What libcsv calls back for.
struct Rows {
    const CsvRow& use;
    std::vector<std::string> fields;
    long begin = 0; // the line of the row; 0 between two
};

void TakeField(void* bytes, std::size_t size, void* data) {
    static_cast<Rows*>(data)->fields.emplace_back(static_cast<const char*>(bytes), size);
}

void TakeRow(int /*end*/, void* data) {
    Rows& rows = *static_cast<Rows*>(data);
    rows.use(rows.begin, rows.fields);
    rows.fields.clear();
    rows.begin = 0;
}

// Cuts off the first line, its end included.
std::string_view TakeLine(std::string_view& text) {
    std::size_t end = std::min(text.find_first_of("\r\n"), text.size());
    end += text.substr(end).starts_with("\r\n") ? 2 : 1;
    const std::string_view line = text.substr(0, end);
    text.remove_prefix(line.size());
    return line;
}

std::string WhyNotRead(csv_parser& parser, const Rows& rows) {
    return "line " + std::to_string(rows.begin) +
           (csv_error(&parser) == CSV_EPARSE ? ": its quotation marks do not fit: one within a field is "
                                               "doubled, and the field is between two; what follows it "
                                               "was not read"
                                             : ": there is no memory for it");
}

// Digits from the beginning of the text, which loses them.
std::string_view TakeDigits(std::string_view& text) {
    const std::string_view digits = text.substr(0, text.find_first_not_of("0123456789"));
    text.remove_prefix(digits.size());
    return digits;
}

// The separator of groups that the text begins with, empty for none. A comma and a point are one as far as
// they are not the decimal mark; so are blanks of three widths and apostrophes of two forms.
std::string_view SeparatorAt(std::string_view text, char decimal) {
    for (const std::string_view each : {",", ".", " ", "'", "\xC2\xA0", "\xE2\x80\xAF", "\xE2\x80\x99"})
        if (text.starts_with(each) && each.front() != decimal)
            return each;
    return {};
}

} // namespace

std::string ReadCsv(std::string_view text, char delimiter, const CsvRow& use) {
    csv_parser parser;
    if (csv_init(&parser, CSV_STRICT | CSV_STRICT_FINI) != 0)
        return "there is no memory for it";
    csv_set_delim(&parser, static_cast<unsigned char>(delimiter));
    if (text.starts_with(ByteOrderMark))
        text.remove_prefix(ByteOrderMark.size());
    const char* const blank = delimiter == '\t' ? " \r\n" : " \t\r\n";
    Rows rows{use, {}};
    std::string wrong;
    for (long number = 1; !text.empty() && wrong.empty(); ++number) {
        const std::string_view line = TakeLine(text);
        if (rows.begin == 0 && line.find_first_not_of(blank) != line.npos)
            rows.begin = number;
        if (csv_parse(&parser, line.data(), line.size(), TakeField, TakeRow, &rows) != line.size())
            wrong = WhyNotRead(parser, rows);
    }
    if (wrong.empty() && csv_fini(&parser, TakeField, TakeRow, &rows) != 0)
        wrong = WhyNotRead(parser, rows);
    csv_free(&parser);
    return wrong;
}

PlainNumber ReadPlainNumber(std::string_view text, char decimal) {
    PlainNumber none{{}, "is no number"};
    const char mark = decimal == 0 ? '.' : decimal;
    PlainNumber number;
    if (text.starts_with('-') || text.starts_with('+')) {
        number.text += text.front();
        text.remove_prefix(1);
    }
    std::string_view digits = TakeDigits(text);
    const std::string_view separator = SeparatorAt(text, mark);
    if (!separator.empty() && (digits.empty() || digits.size() > GroupDigits || digits.front() == '0'))
        return none;
    number.text += digits;
    std::size_t groups = 0;
    for (; !separator.empty() && text.starts_with(separator); ++groups) {
        text.remove_prefix(separator.size());
        digits = TakeDigits(text);
        if (digits.size() != GroupDigits)
            return none;
        number.text += digits;
    }
    if (decimal == 0 && separator == "," && groups == 1 && text.empty())
        return {{}, "may be a whole number or a broken one: say --decimal . or --decimal ,"};
    if (text.starts_with(mark)) {
        text.remove_prefix(1);
        number.text += '.';
        number.text += TakeDigits(text);
    }
    if (text.starts_with('e') || text.starts_with('E'))
        number.text += text; // for who stores it to judge
    else if (!text.empty())
        return none;
    return number;
}
