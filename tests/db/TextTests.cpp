#include <gtest/gtest.h>

#include <limits>

#include "SampleFile.h"

namespace {

class TextTest : public testing::Test {
  protected:
    TextTest() { EXPECT_EQ(CreateRows(database_, folder_.File("rows.db")), 0); }

    void Write(const std::string& text) const { folder_.Write("rows.txt", text); }
    std::string Text() const { return folder_.Read("rows.txt"); }
    long Load(const std::string& text, const char* separators = "\t\n") {
        Write(text);
        return database_.Load(path_.c_str(), separators);
    }
    std::string LineOf(const ROW& row, const char* separator = "|") const {
        std::string line;
        database_.FormatRecordData(&line, &row, separator);
        return line;
    }
    ROW Record(long n) {
        ROW row{};
        EXPECT_EQ(database_.Read(n, &row), 1);
        return row;
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.txt");
    DATABASE database_{nullptr};
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
    DATABASE database(nullptr);
    const COLUMN_ENTRY columns[] = {Column("Name", ColumnType::String, 8), Column("Kind", ColumnType::Byte),
                                    Column("Price", ColumnType::Float), Column("Bought", ColumnType::Date),
                                    Column("Sold", ColumnType::Time)};
    ASSERT_EQ(database.Create(folder_.File("example.db").c_str(), "", 5, columns), 0);
    Write(example);
    EXPECT_EQ(database.Load(path_.c_str(), "|\n"), 2);
    EXPECT_EQ(database.Query("Bought = 19990105", QueryMode::New), 1);
    EXPECT_EQ(database.Query("Price = 12.25", QueryMode::And), 1);
    database.SetByteOutputFormat(1);
    EXPECT_EQ(database.Export(path_.c_str(), 1, "|"), 2);
    EXPECT_EQ(Text(), example);
}

TEST_F(TextTest, ExportOfAllAndOfTheSet) {
    const std::vector<ROW> rows = {Row("c"), Row("b", 1), Row("gone"), Row("a", 1)};
    EXPECT_EQ(database_.AppendAll(rows.data(), sizeof(ROW), 4), 0);
    EXPECT_EQ(database_.Delete(2), 0);
    EXPECT_EQ(database_.Query("Tag = 1", QueryMode::New), 2);
    EXPECT_EQ(database_.SortBy("Name", 0), 0);
    Write(std::string(100'000, 'x')); // is replaced, whole
    EXPECT_EQ(database_.Export(path_.c_str(), 0, "\t"), 2);
    EXPECT_EQ(Text(), LineOf(rows[3], "\t") + LineOf(rows[1], "\t"));
    EXPECT_EQ(database_.Export(path_.c_str(), 1, "\t"), 3);
    EXPECT_EQ(Text(), LineOf(rows[0], "\t") + LineOf(rows[1], "\t") + LineOf(rows[3], "\t"));
}

TEST_F(TextTest, WhatIsExportedLoadsBack) {
    std::vector<ROW> rows;
    rows.reserve(20'001);
    for (int i = 0; i < 20'000; ++i) { // several blocks, batches and lines across them
        rows.push_back(Row("row " + std::string(static_cast<std::size_t>(i % 11), 'x'), i % 7 - 3,
                           i % 1000 - 500, i * 1'000, static_cast<float>(i) / 4,
                           {5, 1, static_cast<std::int16_t>(1900 + i % 300)},
                           {30, 15, static_cast<std::int8_t>(i % 24)}));
    }
    rows.push_back(Row("big", 10, 0, 0, -std::numeric_limits<float>::max()));
    EXPECT_EQ(database_.AppendAll(rows.data(), sizeof(ROW), static_cast<std::int32_t>(rows.size())), 0);
    const CONTENT content = ContentOf(database_);
    EXPECT_EQ(database_.Export(path_.c_str(), 1, "\t"), static_cast<long>(rows.size()));
    DATABASE copy(nullptr);
    ASSERT_EQ(CreateRows(copy, folder_.File("copy.db")), 0);
    EXPECT_EQ(copy.Load(path_.c_str(), "\t\n"), static_cast<long>(rows.size()));
    EXPECT_EQ(copy.Update(&rows.back()), 0) << "the last one is current";
    CONTENT expected = content;
    for (auto& record : expected) { // a byte is read as the first character of its number
        ROW row{};
        std::memcpy(&row, record->data(), sizeof(row));
        row.tag = row.tag < 0 ? '-' : row.tag == 10 ? '1' : static_cast<std::int8_t>('0' + row.tag);
        std::memcpy(record->data(), &row, sizeof(row));
    }
    std::memcpy(expected.back()->data(), &rows.back(), sizeof(ROW));
    EXPECT_EQ(ContentOf(copy), expected);
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
        {"\t\t\n", none},
        {"x\tx\tx\tx\tx\tx\tx\n", Row("x", 'x', 0, 0, 0, {0, 0, 0}, {0, 0, 0})},
    };
    for (const auto& field : cases) {
        const std::string first = "1\t1\t1\t1\t1\t1\t1\n"; // passes the check, and leaves nothing in the next
        const long number = static_cast<long>(ContentOf(database_).size());
        EXPECT_EQ(Load(first + field.line), 2);
        EXPECT_EQ(BytesOf(Record(number + 1)), BytesOf(field.row)) << field.line;
    }
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
        {line + "\r\n" + line + "\r\n", "|\r\n", 2, 0},
        {line + "|1\n", "|\n", -1, 1802},
        {"a|1|1|1|1|1\n" + line, "|\n", -1, 1802},
        {line + "|\n", "|", -1, 1802}, // the newline is a field when it does not separate
        {line, "", -1, 1802},
        {line, nullptr, -1, 1802},
    };
    for (const auto& file : cases) {
        const std::size_t before = ContentOf(database_).size();
        EXPECT_EQ(Load(file.text, file.separators), file.loaded) << file.text;
        EXPECT_EQ(database_.GetLastError(nullptr), file.code) << file.text;
        EXPECT_EQ(ContentOf(database_).size(), before + static_cast<std::size_t>(std::max(file.loaded, 0L)));
    }
}

TEST_F(TextTest, NewlineThatDoesNotSeparateBelongsToTheLastField) {
    DATABASE database(nullptr);
    const COLUMN_ENTRY columns[] = {Column("A", ColumnType::String, 4), Column("B", ColumnType::String, 4)};
    ASSERT_EQ(database.Create(folder_.File("two.db").c_str(), "", 2, columns), 0);
    Write("a,b\nc,d");
    EXPECT_EQ(database.Load(path_.c_str(), ","), 2);
    char data[8];
    EXPECT_EQ(database.Read(0, data), 1);
    EXPECT_STREQ(data + 4, "b\n");
}

TEST_F(TextTest, LongLineIsReadInPieces) {
    DATABASE database(nullptr);
    const COLUMN_ENTRY column = Column("A", ColumnType::String, 8);
    ASSERT_EQ(database.Create(folder_.File("one.db").c_str(), "", 1, &column), 0);
    ASSERT_EQ(database.CalculateIOBufferSize(), 11); // pieces of 10 characters
    Write("abcdefghijklmnopqrstuvwxy\nz\n0123456789\n");
    EXPECT_EQ(database.Load(path_.c_str(), "\n"), 5);
    for (long i = 0; const char* text : {"abcdefg", "klmnopq", "uvwxy", "z", "0123456"}) {
        char data[8];
        EXPECT_EQ(database.Read(i++, data), 1);
        EXPECT_STREQ(data, text);
    }
}

TEST_F(TextTest, LineThatExportWroteIsNotReadInPieces) {
    DATABASE database(nullptr);
    const COLUMN_ENTRY column = Column("A", ColumnType::Float);
    ASSERT_EQ(database.Create(folder_.File("one.db").c_str(), "", 1, &column), 0);
    const float lowest[2] = {-std::numeric_limits<float>::max()};
    float data[2] = {};
    EXPECT_EQ(database.Append(lowest), 0);
    EXPECT_EQ(database.Export(path_.c_str(), 1, "\n"), 1);
    EXPECT_GT(std::filesystem::file_size(path_), static_cast<std::size_t>(database.CalculateIOBufferSize()));
    EXPECT_EQ(database.Load(path_.c_str(), "\n"), 1);
    EXPECT_EQ(database.Read(1, data), 1);
    EXPECT_EQ(data[0], lowest[0]);
}

TEST_F(TextTest, PathsThatAreRefused) {
    EXPECT_EQ(Load("a|1|1|1|1|1|1\n", "|\n"), 1);
    const std::string data = folder_.File("rows.db");
    std::filesystem::create_symlink(data, folder_.File("link"));
    const CONTENT content = ContentOf(database_);
    for (const std::string& path : {data, folder_.File("link"), folder_.File(""), folder_.File("no/file")}) {
        EXPECT_EQ(database_.Load(path.c_str(), "|\n"), -1) << path;
        EXPECT_EQ(database_.GetLastError(nullptr), 1801) << path;
        EXPECT_EQ(database_.Export(path.c_str(), 1, "|"), -1) << path;
        EXPECT_EQ(database_.GetLastError(nullptr), 1901) << path;
    }
    EXPECT_EQ(ContentOf(database_), content);
    // Without a data file no text is touched.
    const std::string text = Text();
    DATABASE closed(nullptr);
    EXPECT_EQ(closed.Export(path_.c_str(), 1, "|"), -1);
    EXPECT_EQ(closed.GetLastError(nullptr), 1908);
    EXPECT_EQ(closed.Load(path_.c_str(), "|"), -1);
    EXPECT_EQ(closed.GetLastError(nullptr), 1808);
    EXPECT_EQ(Text(), text);
}

} // namespace
