#include <functional>

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
