#include <limits>

#include "SampleFile.h"

namespace {

using TextTest = RowsTest;

TEST_F(TextTest, FieldsAsText) {
    using Limits = std::numeric_limits<float>;
    const std::pair<ROW, const char*> cases[] = {
        {Row("Acorn", 65, 7, 8, 1.005F, {5, 1, 1999}, {30, 15, 9}), "Acorn|65|7|8|1.00|19990105|091530|\n"},
        {Row("", -128, -32768, std::numeric_limits<int>::min(), -0.005F, {0, 0, 0}, {0, 0, 0}),
         " |-128|-32768|-2147483648|-0.00|00000000|000000|\n"},
        {Row("sixteen letters!", 0, 0, 0, Limits::infinity(), {-128, -1, -32768}, {-1, -10, -128}),
         "sixteen letters!|0|0|0|inf|-32768-1-128|-128-10-1|\n"},
        {Row("x", 0, 0, 0, -Limits::quiet_NaN(), {1, 1, -5}), "x|0|0|0|nan|-0050101|120000|\n"}};
    std::string line;
    for (const auto& [row, expected] : cases) {
        database_.FormatRecordData(&line, &row, "|");
        EXPECT_EQ(line, expected);
    }
    database_.SetByteOutputFormat(1);
    database_.FormatRecordData(&line, &newRow_, ", ");
    EXPECT_EQ(line, "new, \1, 9, 1, 0.00, 20000101, 120000, \n");
    database_.SetByteOutputFormat(3);
    database_.FormatRecordData(&line, &newRow_, nullptr);
    EXPECT_EQ(line, "new1910.0020000101120000\n");
}

TEST_F(TextTest, ExportsAllOrTheSetInItsOrder) {
    Create("other.db", {Column("A", ColumnType::String, 8)});
    texts_.Write("text", "cherry\ngone\napple\nbread\n");
    Play("load \n: 4; delete 1: 0");
    const auto exported = [this](int all) {
        const long lines = database_.Export(text_.c_str(), all, "|");
        return std::to_string(lines) + " " + texts_.Read("text");
    };
    EXPECT_EQ(exported(0), "3 cherry|\napple|\nbread|\n") << "without a set, all";
    Play("new A != bread: 2; sort A: 0");
    EXPECT_EQ(exported(0), "2 apple|\ncherry|\n");
    EXPECT_EQ(exported(1), "3 cherry|\napple|\nbread|\n");
}

// Several blocks, batches and lines across them.
TEST_F(TextTest, WhatIsExportedLoadsBack) {
    std::vector<ROW> rows = {Row("big", 1, 0, 0, -std::numeric_limits<float>::max())};
    for (int i = 0; i < 20'000; ++i)
        rows.push_back(
            Row("row " + std::string(i % 11U, 'x'), i % 7, i % 1000 - 500, i * 1'000, static_cast<float>(i)));
    Append(rows);
    EXPECT_EQ(database_.Export(text_.c_str(), 1, "\t"), std::ssize(rows));
    EXPECT_EQ(database_.Load(text_.c_str(), "\t\n"), std::ssize(rows));
    const CONTENT content = ContentOf(database_);
    EXPECT_EQ(database_.Update(&rows.back()), 0) << "the last one is current";
    for (std::size_t i = 0; i < rows.size(); ++i) {
        rows[i].tag = static_cast<std::int8_t>('0' + rows[i].tag); // read as its number's first character
        ASSERT_EQ(content[rows.size() + i], BytesOf(rows[i])) << i;
    }
}

// A text that is loaded into a new file, and the records' text or the error's code.
TEST_F(TextTest, LinesThatAreLoaded) {
    const std::vector<COLUMN_ENTRY> one = {Column("A", ColumnType::String, 8)};
    const std::vector<COLUMN_ENTRY> two(2, Column("A", ColumnType::String, 4));
    const std::vector<COLUMN_ENTRY> bytes(2, Column("WiderThanText", ColumnType::Byte));
    const std::vector<COLUMN_ENTRY> number = {Column("A", ColumnType::Float)};
    const std::string heading = "WiderThanText|WiderThanText|\n";
    const std::string lowest = "-340282346638528859811704183484516925440.00|\n";
    const std::string line = "a|1|1|1|1|1|1";
    const std::string out = "a|49|1|1|1.00|00010000|010000|\n";
    const std::string full = out + "b|99|1|2|3.00|19990105|091530|\n";
    const struct {
        const std::vector<COLUMN_ENTRY>& columns;
        const char* separators;
        std::string text;
        std::string outcome;
        int byteFormat = 1;
        bool hasHeading = false;
    } cases[] = {
        {RowColumns, "|\n", line + "\nb|c|1|2|3|19990105|091530\n", full},
        {RowColumns, "|\n", line + "\n||b||c|1|2|3|19990105|091530|||more\n", full},
        {RowColumns, "|\n",
         line + "\nseventeen letters|65|65537|4294967297|-1.5|1999|1", // no newline at the end
         out + "seventeen lette|54|1|1|-1.50|19990000|010000|\n"},
        {RowColumns, "|\n", line + "\nshort|-\n", out + "short|45|0|0|0.00|00000000|000000|\n"},
        {RowColumns, "|\n", line + "\na|-|0|0|-nan\n", out + "a|45|0|0|nan|00000000|000000|\n"},
        {RowColumns, "|\n", line + "\n||\n", out + " |0|0|0|0.00|00000000|000000|\n"},
        {RowColumns, "|\n", "", ""},
        {RowColumns, "|\n", "\n" + line + "\n\n\n" + line + "\n\n", out + out},
        {RowColumns, "|\r\n", "\r\n" + line + "\r\n\r\n" + line + "\r\n\r", out + out},
        {RowColumns, "|\n", line + "|1\n", "1802"},
        {RowColumns, "|", line + "|\n", "1802"}, // the newline is a field when it does not separate
        {RowColumns, "", line, "1802"},
        {two, ",", "a,b\nc,d", "a|b\n|\nc|d|\n"},
        {one, "\n", "abcdefghijklmnopqrstuvwxy\nz\n0123456789\n", // in pieces of ten characters
         "abcdefg|\nklmnopq|\nuvwxy|\nz|\n0123456|\n"},
        {number, "|\n", lowest, lowest}, // what Export wrote is not read in pieces
        {bytes, "|\n", "-7|300\nx|65|\n", "45|51|\n120|54|\n"},
        {bytes, "|\n", "-7|300\nx|65|\n", "-7|44|\n0|65|\n", 2},
        {bytes, "|\n", "one field\n-7|300\nx|65|\n", heading + "-7|44|\n0|65|\n", 2, true},
        {bytes, "|\n", "", heading, 2, true},
        {bytes, "|\n", "one field\n\n", heading, 2, true},
        {bytes, "|\n", "a|b\n1\n", "1802", 2, true},
    };
    for (const auto& lines : cases) {
        std::filesystem::remove(folder_.File("other.db"));
        database_.SetByteInputFormat(lines.byteFormat);
        database_.SetHeadingLine(lines.hasHeading);
        Create("other.db", lines.columns);
        texts_.Write("text", lines.text);
        const long loaded = Run(std::string("load ") + lines.separators);
        const bool refused = loaded > 1000;
        EXPECT_EQ(database_.Export(text_.c_str(), 1, "|"), refused ? 0 : loaded);
        EXPECT_EQ(refused ? std::to_string(loaded) : texts_.Read("text"), lines.outcome) << lines.text;
    }
}

TEST_F(TextTest, PathsThatAreRefused) {
    Append({newRow_});
    std::filesystem::create_symlink(path_, folder_.File("link"));
    const CONTENT content = ContentOf(database_);
    for (const std::string& path : {path_, folder_.File("link"), folder_.File(""), folder_.File("no/file")}) {
        EXPECT_EQ(Code(database_.Load(path.c_str(), "|\n")), 1801) << path;
        EXPECT_EQ(Code(database_.Export(path.c_str(), 1, "|")), 1901) << path;
    }
    EXPECT_EQ(ContentOf(database_), content);
}

} // namespace
