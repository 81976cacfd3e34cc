#include <limits>
#include <sstream>

#include "SampleFile.h"

namespace {

class TextTest : public RowsTest {
  protected:
    long Load(const std::string& text, const char* separators = "\t\n") {
        folder_.Write("rows.txt", text);
        return database_.Load(text_.c_str(), separators);
    }
    // Makes a file of other columns and loads a text into it.
    long LoadInto(const std::vector<COLUMN_ENTRY>& columns, const std::string& text, const char* separators) {
        const auto count = static_cast<int>(columns.size());
        EXPECT_EQ(database_.Create(folder_.File("other.db").c_str(), "", count, columns.data()), 0);
        return Load(text, separators);
    }
    std::string LineOf(const ROW& row, const char* separator = "|") const {
        std::string line;
        database_.FormatRecordData(&line, &row, separator);
        return line;
    }

    std::string text_ = folder_.File("rows.txt");
};

TEST_F(TextTest, FieldsAsText) {
    using Limits = std::numeric_limits<float>;
    const struct {
        ROW row;
        const char* line;
    } cases[] = {
        {Row("Acorn", 65, 7, 8, 1.005F, {5, 1, 1999}, {30, 15, 9}), "Acorn|65|7|8|1.00|19990105|091530|\n"},
        {Row("", -128, -32768, std::numeric_limits<int>::min(), -0.005F, {0, 0, 0}, {0, 0, 0}),
         " |-128|-32768|-2147483648|-0.00|00000000|000000|\n"},
        {Row("sixteen letters!", 0, 0, 0, Limits::infinity(), {-128, -1, -32768}, {-1, -10, -128}),
         "sixteen letters!|0|0|0|inf|-32768-1-128|-128-10-1|\n"},
        {Row("x", 0, 0, 0, -Limits::quiet_NaN()), "x|0|0|0|nan|20000101|120000|\n"},
        {Row("x", 0, 0, 0, -Limits::max(), {1, 1, -5}),
         "x|0|0|0|-340282346638528859811704183484516925440.00|-0050101|120000|\n"},
    };
    for (const auto& field : cases) {
        EXPECT_EQ(LineOf(field.row), field.line);
    }
    database_.SetByteOutputFormat(1);
    EXPECT_EQ(LineOf(Row("a", 65), ", "), "a, A, 0, 0, 0.00, 20000101, 120000, \n");
    database_.SetByteOutputFormat(3);
    EXPECT_EQ(LineOf(Row("a", 65), nullptr), "a65000.0020000101120000\n");
}

// The document's example is loaded and exported again, bytes as the characters that they were read as.
TEST_F(TextTest, LinesAreAsDocumented) {
    std::ifstream document(TEXT_FILE_DOCUMENT);
    const std::string text(std::istreambuf_iterator<char>(document), {});
    const std::size_t end = text.rfind("```");
    const std::size_t begin = text.rfind("```\n", end - 1) + 4;
    const std::string example = text.substr(begin, end - begin);
    ASSERT_EQ(LoadInto({Column("Name", ColumnType::String, 8), Column("Kind", ColumnType::Byte),
                        Column("Price", ColumnType::Float), Column("Bought", ColumnType::Date),
                        Column("Sold", ColumnType::Time)},
                       example, "|\n"),
              2);
    EXPECT_EQ(database_.Query("Bought = 19990105", QueryMode::New), 1);
    EXPECT_EQ(database_.Query("Price = 12.25", QueryMode::And), 1);
    database_.SetByteOutputFormat(1);
    EXPECT_EQ(database_.Export(text_.c_str(), 1, "|"), 2);
    EXPECT_EQ(folder_.Read("rows.txt"), example);
}

TEST_F(TextTest, ExportsAllOrTheSetInItsOrder) {
    Append({Row("cherry", 1), Row("gone", 1), Row("apple", 1), Row("bread", 2)});
    ASSERT_EQ(database_.Delete(1), 0);
    const auto names = [this](DATABASE& database, int all) {
        const long lines = database.Export(text_.c_str(), all, "|");
        std::istringstream text(folder_.Read("rows.txt"));
        std::string found;
        for (std::string line; std::getline(text, line);) {
            found += line.substr(0, line.find('|')) + " ";
        }
        return found + std::to_string(lines);
    };
    EXPECT_EQ(names(database_, 0), "cherry apple bread 3") << "without a set, all";
    ASSERT_EQ(database_.Query("Tag = 1", QueryMode::New) + database_.SortBy("Name", 0), 2);
    EXPECT_EQ(names(database_, 0), "apple cherry 2");
    EXPECT_EQ(names(database_, 1), "cherry apple bread 3");
}

// Several blocks, batches and lines across them.
TEST_F(TextTest, WhatIsExportedLoadsBack) {
    std::vector<ROW> rows;
    rows.reserve(20'001);
    for (int i = 0; i < 20'000; ++i) {
        rows.push_back(Row("row " + std::string(static_cast<std::size_t>(i % 11), 'x'), i % 7, i % 1000 - 500,
                           i * 1'000, static_cast<float>(i) / 4));
    }
    rows.push_back(Row("big", 1, 0, 0, -std::numeric_limits<float>::max()));
    Append(rows);
    const auto count = static_cast<long>(rows.size());
    EXPECT_EQ(database_.Export(text_.c_str(), 1, "\t"), count);
    EXPECT_EQ(database_.Load(text_.c_str(), "\t\n"), count);
    const CONTENT content = ContentOf(database_);
    EXPECT_EQ(database_.Update(&rows.back()), 0) << "the last one is current";
    for (std::size_t i = 0; i < rows.size(); ++i) {
        rows[i].tag = static_cast<std::int8_t>('0' + rows[i].tag); // read as its number's first character
        ASSERT_EQ(content[rows.size() + i], BytesOf(rows[i])) << i;
    }
}

TEST_F(TextTest, FieldsOfALine) {
    const ROW none = Row("", 0, 0, 0, 0, {0, 0, 0}, {0, 0, 0});
    const struct {
        const char* line;
        ROW row;
    } cases[] = {
        {"a\tb\t1\t2\t3\t19990105\t091530\n", Row("a", 'b', 1, 2, 3, {5, 1, 1999}, {30, 15, 9})},
        {"\t\ta\t\tb\t1\t2\t3\t19990105\t091530\t\t\tmore\n",
         Row("a", 'b', 1, 2, 3, {5, 1, 1999}, {30, 15, 9})},
        {"seventeen letters\t65\t65537\t4294967297\t-1.5\t1999\t1", // no newline at the end
         Row("seventeen lette", '6', 1, 1, -1.5F, {0, 0, 1999}, {0, 0, 1})},
        {"short\t-\n", Row("short", '-', 0, 0, 0, {0, 0, 0}, {0, 0, 0})},
        {"a\t-\t0\t0\t-nan\n", Row("a", '-', 0, 0, std::numeric_limits<float>::quiet_NaN(), {}, {})},
        {"\t\t\n", none},
        {"x\tx\tx\tx\tx\tx\tx\n", Row("x", 'x', 0, 0, 0, {0, 0, 0}, {0, 0, 0})},
    };
    for (const auto& field : cases) {
        const std::string first = "1\t1\t1\t1\t1\t1\t1\n"; // passes the check, and leaves nothing in the next
        const long number = static_cast<long>(ContentOf(database_).size());
        EXPECT_EQ(Load(first + field.line), 2);
        EXPECT_EQ(BytesOf(At(number + 1)), BytesOf(field.row)) << field.line;
    }
}

TEST_F(TextTest, BytesAsNumbersAndAHeading) {
    const COLUMN_ENTRY tag = Column("TagOfThirteen", ColumnType::Byte); // wider than a byte's text
    for (const int format : {1, 2}) {
        std::filesystem::remove(folder_.File("other.db"));
        database_.SetByteInputFormat(format);
        database_.SetHeadingLine(false);
        ASSERT_EQ(LoadInto({tag, tag}, "-7|300\nx|65|\n", "|\n"), 2);
        database_.SetByteOutputFormat(2);
        database_.SetHeadingLine(true);
        EXPECT_EQ(database_.Export(text_.c_str(), 1, "|"), 2);
        EXPECT_EQ(folder_.Read("rows.txt"), std::string("TagOfThirteen|TagOfThirteen|\n") +
                                                (format == 1 ? "45|51|\n120|54|\n" : "-7|44|\n0|65|\n"));
        database_.SetByteOutputFormat(format);
        const CONTENT content = ContentOf(database_);
        EXPECT_EQ(database_.Export(text_.c_str(), 1, "|"), 2);
        EXPECT_EQ(database_.Load(text_.c_str(), "|\n"), 2);
        for (std::size_t i = 0; i < 2; ++i) {
            EXPECT_EQ(ContentOf(database_)[i + 2], content[i]) << format;
        }
    }
    for (const char* text : {"", "one field", "one field\n\n"}) {
        EXPECT_EQ(Load(text, "|\n"), 0) << text;
    }
    EXPECT_EQ(CodeOf(Load("a|b\n1\n", "|\n")), 1802);
}

TEST_F(TextTest, LinesOfAFile) {
    const std::string line = "a|1|1|1|1|1|1";
    const struct {
        std::string text;
        const char* separators;
        long loaded;
        int code;
    } cases[] = {
        {"", "|\n", 0, 0},
        {"\n\n", "|\n", 0, 0},
        {"\n" + line + "\n\n\n" + line + "\n\n", "|\n", 2, 0},
        {"\r\n" + line + "\r\n\r\n" + line + "\r\n\r", "|\r\n", 2, 0},
        {line + "|1\n", "|\n", -1, 1802},
        {"a|1|1|1|1|1\n" + line, "|\n", -1, 1802},
        {line + "|\n", "|", -1, 1802}, // the newline is a field when it does not separate
        {line, "", -1, 1802},
        {line, nullptr, -1, 1802},
    };
    for (const auto& file : cases) {
        const std::size_t before = ContentOf(database_).size();
        const long loaded = Load(file.text, file.separators);
        EXPECT_EQ(CodeOf(loaded), file.code) << file.text;
        EXPECT_EQ(loaded, file.loaded) << file.text;
        EXPECT_EQ(ContentOf(database_).size(), before + static_cast<std::size_t>(std::max(file.loaded, 0L)));
    }
}

TEST_F(TextTest, LinesAreCutAsTheyAreRead) {
    const auto texts = [this](const std::vector<COLUMN_ENTRY>& columns, const char* text,
                              const char* separators) {
        std::filesystem::remove(folder_.File("other.db"));
        EXPECT_GT(LoadInto(columns, text, separators), 0);
        std::vector<std::string> last; // fields of the records
        for (const auto& record : ContentOf(database_)) {
            last.emplace_back(record->c_str() + record->size() - columns.back().size);
        }
        return last;
    };
    const COLUMN_ENTRY narrow = Column("A", ColumnType::String, 4);
    EXPECT_EQ(texts({narrow, narrow}, "a,b\nc,d", ","), (std::vector<std::string>{"b\n", "d"}))
        << "a newline that does not separate belongs to the last field";
    EXPECT_EQ(texts({Column("A", ColumnType::String, 8)}, "abcdefghijklmnopqrstuvwxy\nz\n0123456789\n", "\n"),
              (std::vector<std::string>{"abcdefg", "klmnopq", "uvwxy", "z", "0123456"}))
        << "a long line is read in pieces of ten characters";
    EXPECT_EQ(database_.CalculateIOBufferSize(), 11);
}

TEST_F(TextTest, LineThatExportWroteIsNotReadInPieces) {
    ASSERT_EQ(LoadInto({Column("A", ColumnType::Float)}, "", "\n"), 0);
    const float lowest[2] = {-std::numeric_limits<float>::max()};
    float data[2] = {};
    EXPECT_EQ(database_.Append(lowest), 0);
    EXPECT_EQ(database_.Export(text_.c_str(), 1, "\n"), 1);
    EXPECT_GT(std::filesystem::file_size(text_), static_cast<std::size_t>(database_.CalculateIOBufferSize()));
    EXPECT_EQ(database_.Load(text_.c_str(), "\n"), 1);
    EXPECT_EQ(database_.Read(1, data), 1);
    EXPECT_EQ(data[0], lowest[0]);
}

TEST_F(TextTest, PathsThatAreRefused) {
    const std::string line = "a|1|1|1|1|1|1\n";
    EXPECT_EQ(Load(line, "|\n"), 1);
    std::filesystem::create_symlink(path_, folder_.File("link"));
    const CONTENT content = ContentOf(database_);
    for (const std::string& path : {path_, folder_.File("link"), folder_.File(""), folder_.File("no/file")}) {
        EXPECT_EQ(CodeOf(database_.Load(path.c_str(), "|\n")), 1801) << path;
        EXPECT_EQ(CodeOf(database_.Export(path.c_str(), 1, "|")), 1901) << path;
    }
    EXPECT_EQ(ContentOf(database_), content);
    DATABASE closed(nullptr);
    EXPECT_EQ(Code(closed, closed.Export(text_.c_str(), 1, "|")), 1908);
    EXPECT_EQ(Code(closed, closed.Load(text_.c_str(), "|")), 1808);
    EXPECT_EQ(folder_.Read("rows.txt"), line) << "without a data file no text is touched";
}

} // namespace
