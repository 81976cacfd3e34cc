#include <functional>
#include <random>

#include "SampleFile.h"

namespace {

TEST_F(RowsTest, CreateLaysOutColumns) {
    const std::string path = folder_.File("a.db");
    const struct {
        COLUMN_ENTRY wanted;
        int size, offset, format;
    } columns[] = {{Column("Name", ColumnType::String, 32), 32, 0, 0},
                   {Column("Price", ColumnType::Float), 8, 32, 2},
                   {Column("Wide", ColumnType::Byte, 7), 7, 40, 0},
                   {Column("Rate", ColumnType::Float, 4, 0x35), 4, 47, 0x35}};
    std::vector<COLUMN_ENTRY> wanted;
    for (const auto& column : columns) {
        wanted.push_back(column.wanted);
    }
    ASSERT_EQ(database_.Create(path.c_str(), "text", 4, wanted.data()), 0);
    DATABASE_HEADER header{};
    EXPECT_EQ(database_.GetHeaderInfo(&header), 0);
    EXPECT_EQ(header.recordLength, 1 + 32 + 8 + 7 + 4);
    EXPECT_EQ(folder_.Read("a.db").size(), 52U + 4 * 44);
    COLUMN_ENTRY made{};
    for (int i = 0; const auto& column : columns) {
        EXPECT_EQ(database_.GetColumnInfo(i++, &made), 0);
        EXPECT_STREQ(made.name, column.wanted.name);
        EXPECT_EQ(std::tuple(+made.size, +made.offset, +made.format),
                  std::tuple(column.size, column.offset, column.format))
            << made.name;
    }
    EXPECT_EQ(database_.CalculateIOBufferSize(), 34 + 16 + 1 + 16 + 4);
    for (int index : {-1, 4}) {
        EXPECT_EQ(CodeOf(database_.GetColumnInfo(index, &made)), 1101);
    }
}

TEST_F(RowsTest, CreateRefusesAndKeepsWhatWasOpen) {
    Append({Row("kept")});
    const std::string before = folder_.Read("rows.db");
    const std::string fresh = folder_.File("new.db");
    const std::vector<COLUMN_ENTRY> fine = {Column("A", ColumnType::Byte)};
    const struct {
        std::string path;
        std::vector<COLUMN_ENTRY> columns;
        int code;
    } cases[] = {
        {path_, fine, 1102},
        {folder_.Path(), fine, 1102},
        {folder_.File("missing/new.db"), fine, 1109},
        {folder_.File(std::string(128, 'x')), fine, 1109},
        {"", fine, 1109},
        {fresh, {Column("A", ColumnType::String)}, 1110},
        {fresh, {Column("A", ColumnType::String, 0)}, 1110},
        {fresh, {Column("A", 9)}, 1110},
        {fresh, std::vector<COLUMN_ENTRY>(2, Column("A", ColumnType::String, 20000)), 1110},
        {fresh, std::vector<COLUMN_ENTRY>(32768, fine[0]), 1110},
    };
    for (const auto& refused : cases) {
        const auto count = static_cast<int>(refused.columns.size());
        EXPECT_EQ(CodeOf(database_.Create(refused.path.c_str(), "", count, refused.columns.data())),
                  refused.code)
            << "case " << &refused - cases;
        EXPECT_EQ(ContentOf(database_).size(), 1U);
    }
    EXPECT_EQ(CodeOf(database_.Create(fresh.c_str(), "", -1, nullptr)), 1110);
    EXPECT_EQ(folder_.Read("rows.db"), before);
    EXPECT_FALSE(folder_.Has("new.db"));
}

// What each operation answers on a record that is active, deleted or locked and on a number outside of the
// file (from 1000 on, an error code); then the status of the three, and which record is current.
TEST_F(RowsTest, OperationsByStatus) {
    static ROW data = Row("same");
    const ROW mark = Row("mark");
    const struct {
        const char* name;
        long (*run)(DATABASE&, long);
        int answers[4];
        const char* after;
        char current; // '#': that record, '-': none, '=': the one before
    } operations[] = {
        {"Read",
         [](DATABASE& d, long n) -> long { return d.Read(n, &data); },
         {1, 1202, 1, 1201},
         "012",
         '#'},
        {"UnBufferedRead",
         [](DATABASE& d, long n) -> long { return d.UnBufferedRead(n, &data); },
         {1, 1202, 1, 1201},
         "012",
         '#'},
        {"Write",
         [](DATABASE& d, long n) -> long { return d.Write(n, &data); },
         {0, 1303, 0, 1302},
         "010",
         '#'},
        {"Delete", [](DATABASE& d, long n) -> long { return d.Delete(n); }, {0, 1403, 0, 1402}, "111", '-'},
        {"UnDelete",
         [](DATABASE& d, long n) -> long { return d.UnDelete(n); },
         {1503, 0, 1503, 1502},
         "002",
         '#'},
        {"Lock", [](DATABASE& d, long n) -> long { return d.Lock(n); }, {0, 2301, 2303, 2302}, "212", '#'},
        {"UnLock",
         [](DATABASE& d, long n) -> long { return d.UnLock(n); },
         {2403, 2401, 0, 2402},
         "010",
         '#'},
        {"IsLocked",
         [](DATABASE& d, long n) -> long { return d.IsLocked(n); },
         {0, 2501, 1, 2502},
         "012",
         '='},
    };
    Append(std::vector<ROW>(4, data));
    ASSERT_EQ(database_.Delete(1) + database_.Lock(2), 0);
    const std::string start = folder_.Read("rows.db");
    const auto record = [](long n) { return DataStartOfRows + static_cast<std::size_t>(n) * RowLength; };
    for (const auto& operation : operations) {
        for (const auto& [kilobytes, n] : {std::pair(0, 0L),
                                           {0, 1},
                                           {0, 2},
                                           {0, 4},
                                           {256, 0},
                                           {256, 1},
                                           {256, 2},
                                           {256, -1},
                                           {256, 1L << 32}}) {
            SCOPED_TRACE(std::string(operation.name) + " " + std::to_string(n) + " cache " +
                         std::to_string(kilobytes));
            folder_.Write("rows.db", start);
            ASSERT_EQ(database_.Open(path_.c_str()) + database_.SetReadCache(kilobytes), 0);
            ASSERT_EQ(database_.Read(0, &data) + database_.Read(3, &data), 2);
            const int answer = operation.answers[n >= 0 && n < 3 ? n : 3];
            const long result = operation.run(database_, n);
            EXPECT_EQ(result, answer < 1000 ? answer : -1);
            EXPECT_EQ(CodeOf(result), answer < 1000 ? 0 : answer);
            std::string expected = start;
            if (answer < 1000) {
                expected[record(n)] = static_cast<char>(operation.after[n] - '0');
                expected[40] = static_cast<char>(1 + (operation.after[n] == '1') - (n == 1));
            }
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            const long current = answer >= 1000 || operation.current == '=' ? 3 : n;
            if (answer < 1000 && operation.current == '-') {
                EXPECT_EQ(CodeOf(database_.Update(&mark)), 2101);
            } else {
                EXPECT_EQ(database_.Update(&mark), 0);
                expected.replace(record(current), RowLength, '\0' + BytesOf(mark));
            }
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            EXPECT_EQ(ContentOf(database_), ContentOf(*std::make_unique<DATABASE>(path_.c_str())));
        }
    }
}

// Up, down and here and there, with changes in between.
TEST_F(RowsTest, ReadsThroughAnyCacheWhatTheFileHolds) {
    std::mt19937 random(7);
    std::vector<ROW> rows;
    for (int i = 0; i < 700; ++i) {
        rows.push_back(Row(std::to_string(i)));
    }
    Append(rows);
    std::vector<bool> deleted(rows.size());
    for (int kilobytes : {0, 1, 6, 256}) {
        ASSERT_EQ(database_.SetReadCache(kilobytes), 0);
        std::size_t n = 0;
        std::size_t step = 1;
        for (int i = 0; i < 5000; ++i) {
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
    EXPECT_EQ(database_.Open("no such file"), -1);
    EXPECT_EQ(database_.Sync(), 0) << "nothing of a file that is closed";
}

TEST_F(RowsTest, ErrorsStayUntilAsked) {
    char message[ErrorMessageSize];
    EXPECT_EQ(database_.GetLastError(message), 0);
    EXPECT_STREQ(message, "No error");
    database_.Read(7, message);
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), 0) << "a success changes nothing";
    EXPECT_EQ(database_.GetLastError(message), 1201);
    EXPECT_STREQ(message, "Read error - ivalid record number");
    EXPECT_EQ(database_.GetLastError(nullptr), 0);
    EXPECT_STREQ(ErrorMessage(4711), "Unknown error");
    EXPECT_STREQ(ErrorMessage(65535), "Unknown error");
    EXPECT_STREQ(ErrorMessage(1607), "Query error - A NEW query must precede an OR or AND query");
    for (int kilobytes : {-1, ReadCache::MaximumKilobytes + 1}) {
        EXPECT_EQ(CodeOf(database_.SetReadCache(kilobytes)), 2601);
    }
}

TEST(ClosedDatabase, AnswersSafely) {
    TemporaryFolder folder;
    for (const std::string& path :
         {std::string(), folder.File("none.db"), folder.Path(), folder.File(std::string(99, 'x'))}) {
        DATABASE database(path.empty() ? nullptr : path.c_str());
        EXPECT_EQ(database.GetLastError(nullptr), path.empty() ? 0 : 1103) << path;
        char data[64] = {};
        const std::pair<std::function<long()>, int> cases[] = {
            {[&] { return database.Append(data); }, 2802},
            {[&] { return database.Read(0, data); }, 1201},
            {[&] { return database.UnBufferedRead(0, data); }, 1201},
            {[&] { return database.Update(data); }, 2101},
            {[&] { return database.Write(0, data); }, 1302},
            {[&] { return database.Delete(0); }, 1402},
            {[&] { return database.Lock(0); }, 2302},
            {[&] { return database.SetImmediateHeaderWrite(1); }, 2901},
            {[&] { return database.WriteDbHeader(); }, 2901},
            {[&] { return database.Query("Name = x", QueryMode::New); }, 1602},
            {[&] { return database.Query("Name = x", QueryMode::Or); }, 1607},
            {[&] { return database.SortBy("Name", 0); }, 1701},
            {[&] { return database.Compress(0); }, 2709},
            {[&] { return database.SetImmediateHeaderWrite(0); }, 0},
            {[&] { return database.QueryReset(); }, 0},
        };
        for (const auto& [run, code] : cases) {
            EXPECT_EQ(Code(database, run()), code);
        }
        EXPECT_TRUE(Walked(database).empty());
        EXPECT_EQ(database.QueryGetLast(nullptr), nullptr);
        EXPECT_EQ(database.ConvertPhysToLogRecordNumber(0), -1);
        EXPECT_FALSE(folder.Has("none.db"));
    }
}

} // namespace
