#include <functional>
#include <random>
#include <sstream>

#include "SampleFile.h"

namespace {

// The bytes of the document's dump: lines of an offset, 1 to 16 bytes and their characters.
std::string DocumentedBytes() {
    std::ifstream document(DATA_FILE_DOCUMENT);
    std::string bytes;
    for (std::string line; std::getline(document, line);) {
        if (line.size() < 10 || line.compare(8, 2, "  ") != 0 ||
            !std::isxdigit(static_cast<unsigned char>(line[0])))
            continue;
        EXPECT_EQ(std::stoul(line.substr(0, 8), nullptr, 16), bytes.size()) << line;
        std::istringstream dump(line.substr(8, line.find('|') - 8));
        for (std::string byte; dump >> byte;)
            bytes += static_cast<char>(std::stoi(byte, nullptr, 16));
    }
    return bytes;
}

TEST_F(RowsTest, FileIsAsDocumented) {
    const COLUMN_ENTRY columns[] = {Column("Name", ColumnType::String, 8), Column("Price", ColumnType::Float),
                                    Column("Bought", ColumnType::Date), Column("Sold", ColumnType::Time)};
    ASSERT_EQ(database_.Create(folder_.File("a.db").c_str(), "example", 4, columns), 0);
    folder_.Write("text", "Acorn|12.25|19990105|091530\nBirch|12.25|19990105|091530\n");
    ASSERT_EQ(database_.Load(folder_.File("text").c_str(), "|\n"), 2);
    ASSERT_EQ(database_.Delete(0) + database_.Lock(1), 0);
    EXPECT_EQ(folder_.Read("a.db"), DocumentedBytes());
}

TEST_F(RowsTest, CreateLaysOutColumns) {
    using namespace ColumnType;
    const COLUMN_ENTRY wanted[] = {Column("Name", String, 32), Column("Price", Float),
                                   Column("Wide", Byte, 7), Column("Rate", Float, 4, 0x35)};
    const std::tuple<std::string, int, int, int> expected[] = {
        {"Name", 32, 0, 0}, {"Price", 8, 32, 2}, {"Wide", 7, 40, 0}, {"Rate", 4, 47, 0x35}};
    const std::string path = folder_.File("a.db");
    ASSERT_EQ(database_.Create(path.c_str(), "text", 4, wanted) + database_.Open(path.c_str()), 0);
    COLUMN_ENTRY made{};
    for (int i = 0; i < 4; ++i) {
        EXPECT_EQ(database_.GetColumnInfo(i, &made), 0);
        EXPECT_EQ(std::tuple(made.name, +made.size, +made.offset, +made.format), expected[i]);
    }
    DATABASE_HEADER header{};
    EXPECT_EQ(database_.GetHeaderInfo(&header), 0);
    EXPECT_EQ(header.recordLength, 1 + 32 + 8 + 7 + 4);
    EXPECT_EQ(database_.CalculateIOBufferSize(), 34 + 16 + 1 + 16 + 4);
    EXPECT_EQ(CodeOf(database_.GetColumnInfo(-1, &made)), 1101);
    EXPECT_EQ(CodeOf(database_.GetColumnInfo(4, &made)), 1101);
}

TEST_F(RowsTest, CreateRefusesAndKeepsWhatWasOpen) {
    Append({Row("kept")});
    const std::string before = folder_.Read("rows.db");
    const std::string fresh = folder_.File("new.db");
    const auto strings = [](std::size_t count, int size) {
        return std::vector<COLUMN_ENTRY>(count, Column("A", ColumnType::String, size));
    };
    const std::tuple<std::string, std::vector<COLUMN_ENTRY>, int> cases[] = {
        {path_, strings(1, 1), 1102},
        {"", strings(1, 1), 1109},
        {folder_.File("missing/new.db"), strings(1, 1), 1109},
        {folder_.File(std::string(128, 'x')), strings(1, 1), 1109},
        {fresh, strings(1, -1), 1110},
        {fresh, strings(2, 20000), 1110},
        {fresh, strings(32768, 1), 1110},
        {fresh, {Column("A", 9)}, 1110}};
    for (const auto& [path, columns, code] : cases) {
        const int count = static_cast<int>(columns.size());
        EXPECT_EQ(CodeOf(database_.Create(path.c_str(), "", count, columns.data())), code) << path;
        EXPECT_EQ(ContentOf(database_).size(), 1U);
    }
    EXPECT_EQ(CodeOf(database_.Create(fresh.c_str(), "", -1, nullptr)), 1110);
    EXPECT_EQ(folder_.Read("rows.db"), before);
    EXPECT_FALSE(folder_.Has("new.db"));
}

// What each operation answers on a record that is active, deleted or locked and on a number outside of the
// file (from 1000 on, an error code); then the status of the three, and which record is current: that one
// (#), none (-) or the one before (=).
TEST_F(RowsTest, OperationsByStatus) {
    ROW data = Row("same");
    const auto read = [&data](DATABASE& database, long n) { return database.Read(n, &data); };
    const auto readFile = [&data](DATABASE& database, long n) { return database.UnBufferedRead(n, &data); };
    const auto write = [&data](DATABASE& database, long n) { return database.Write(n, &data); };
    const struct {
        const char* name;
        std::function<int(DATABASE&, long)> run;
        int answers[4];
        const char* after;
    } operations[] = {{"Read", read, {1, 1202, 1, 1201}, "012#"},
                      {"UnBufferedRead", readFile, {1, 1202, 1, 1201}, "012#"},
                      {"Write", write, {0, 1303, 0, 1302}, "010#"},
                      {"Delete", &DATABASE::Delete, {0, 1403, 0, 1402}, "111-"},
                      {"UnDelete", &DATABASE::UnDelete, {1503, 0, 1503, 1502}, "002#"},
                      {"Lock", &DATABASE::Lock, {0, 2301, 2303, 2302}, "212#"},
                      {"UnLock", &DATABASE::UnLock, {2403, 2401, 0, 2402}, "010#"},
                      {"IsLocked", &DATABASE::IsLocked, {0, 2501, 1, 2502}, "012="}};
    Append(std::vector<ROW>(4, data));
    ASSERT_EQ(database_.Delete(1) + database_.Lock(2), 0);
    const std::string start = folder_.Read("rows.db");
    const ROW mark = Row("mark");
    const auto record = [](long n) { return DataStartOfRows + static_cast<std::size_t>(n) * RowLength; };
    for (const auto& operation : operations) {
        for (const long n : {0L, 1L, 2L, 4L, -1L, 1L << 32}) {
            SCOPED_TRACE(std::string(operation.name) + " " + std::to_string(n));
            folder_.Write("rows.db", start);
            ASSERT_EQ(database_.Open(path_.c_str()) + database_.SetReadCache(n == 2 ? 256 : 0), 0);
            ASSERT_EQ(database_.Read(0, &data) + database_.Read(3, &data), 2);
            const bool inside = n >= 0 && n < 3;
            const int answer = operation.answers[inside ? n : 3];
            const long result = operation.run(database_, n);
            EXPECT_EQ(CodeOf(result), answer < 1000 ? 0 : answer);
            EXPECT_EQ(result, answer < 1000 ? answer : -1);
            std::string expected = start;
            if (inside) {
                expected[record(n)] = static_cast<char>(operation.after[n] - '0');
                expected[40] = static_cast<char>((n == 1 ? 0 : 1) + (operation.after[n] == '1' ? 1 : 0));
            }
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            const char current = answer < 1000 ? operation.after[3] : '=';
            EXPECT_EQ(CodeOf(database_.Update(&mark)), current == '-' ? 2101 : 0);
            if (current != '-')
                expected.replace(record(current == '#' ? n : 3), RowLength, '\0' + BytesOf(mark));
            EXPECT_EQ(folder_.Read("rows.db"), expected);
        }
    }
}

// Up, down and here and there, with changes in between.
TEST_F(RowsTest, ReadsThroughAnyCacheWhatTheFileHolds) {
    std::mt19937 random(7);
    std::vector<ROW> rows(700, Row("row"));
    Append(rows);
    std::vector<bool> deleted(rows.size());
    constexpr int kilobytes[] = {0, 1, 6, 256};
    std::size_t n = 0;
    std::size_t step = 1;
    for (int i = 0; i < 20'000; ++i) {
        if (i % 5000 == 0)
            ASSERT_EQ(database_.SetReadCache(kilobytes[i / 5000]), 0);
        step = random() % 50 == 0 ? random() % 9 + rows.size() - 4 : step;
        n = (random() % 50 == 0 ? random() : n + step) % rows.size();
        const long number = static_cast<long>(n);
        if (random() % 16 == 0 && !deleted[n]) {
            rows[n].count = i;
            ASSERT_EQ(database_.Write(number, &rows[n]), 0);
        } else if (random() % 16 == 0) {
            ASSERT_EQ(deleted[n] ? database_.UnDelete(number) : database_.Delete(number), 0);
            deleted[n] = !deleted[n];
        }
        ROW found = rows[n];
        ASSERT_EQ(database_.Read(number, &found), deleted[n] ? -1 : 1) << n;
        ASSERT_EQ(BytesOf(found), BytesOf(rows[n])) << n;
    }
    // Read downwards, where the file has lost the record but not all that are read ahead.
    ASSERT_EQ(database_.SetReadCache(1), 0);
    database_.Read(50, &rows[0]);
    std::filesystem::resize_file(path_, DataStartOfRows + 45 * RowLength);
    EXPECT_EQ(CodeOf(database_.Read(49, &rows[0])), 1209);
}

TEST_F(RowsTest, CountsAreWrittenAtOnceOrWhenAskedFor) {
    const auto counts = [this] {
        const std::string header = folder_.Read("rows.db");
        return std::pair(header[36], header[40]);
    };
    Append({Row("a"), Row("b")});
    EXPECT_EQ(counts(), std::pair('\2', '\0'));
    EXPECT_EQ(database_.SetImmediateHeaderWrite(0), 0);
    Append({Row("c")});
    EXPECT_EQ(database_.Delete(0), 0);
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), 2);
    EXPECT_EQ(counts(), std::pair('\2', '\0'));
    EXPECT_EQ(database_.SetImmediateHeaderWrite(1), 0);
    EXPECT_EQ(counts(), std::pair('\3', '\1'));
}

TEST_F(RowsTest, ErrorsStayUntilAsked) {
    char message[ErrorMessageSize];
    database_.Read(7, message);
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), 0) << "a success changes nothing";
    EXPECT_EQ(database_.GetLastError(message), 1201);
    EXPECT_STREQ(message, "Read error - ivalid record number");
    EXPECT_EQ(database_.GetLastError(message), 0);
    EXPECT_STREQ(message, "No error");
    EXPECT_STREQ(ErrorMessage(65535), "Unknown error");
    EXPECT_EQ(CodeOf(database_.SetReadCache(-1)), 2601);
    EXPECT_EQ(CodeOf(database_.SetReadCache(ReadCache::MaximumKilobytes + 1)), 2601);
}

TEST(ClosedDatabase, AnswersSafely) {
    TemporaryFolder folder;
    for (const std::string& path :
         {std::string(), folder.File("none.db"), folder.Path(), folder.File(std::string(99, 'x'))}) {
        DATABASE database(path.empty() ? nullptr : path.c_str());
        EXPECT_EQ(database.GetLastError(nullptr), path.empty() ? 0 : 1103) << path;
        char data[64] = {};
        EXPECT_EQ(Code(database, database.Append(data)), 2802);
        EXPECT_EQ(Code(database, database.Read(0, data)), 1201);
        EXPECT_EQ(Code(database, database.Update(data)), 2101);
        EXPECT_EQ(Code(database, database.SetImmediateHeaderWrite(1)), 2901);
        EXPECT_EQ(Code(database, database.Query("Name = x", QueryMode::New)), 1602);
        EXPECT_EQ(Code(database, database.SortBy("Name", 0)), 1701);
        EXPECT_EQ(Code(database, database.Compress(0)), 2709);
        EXPECT_EQ(Code(database, database.Export(folder.File("text").c_str(), 1, "|")), 1908);
        EXPECT_EQ(Code(database, database.Load(folder.File("text").c_str(), "|")), 1808);
        EXPECT_EQ(database.SetImmediateHeaderWrite(0) + database.QueryReset(), 0);
        EXPECT_TRUE(Walked(database).empty());
        EXPECT_EQ(database.ConvertPhysToLogRecordNumber(0), -1);
        EXPECT_TRUE(folder.Names().empty());
    }
}

} // namespace
