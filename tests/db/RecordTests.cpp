#include <gtest/gtest.h>

#include <functional>
#include <random>

#include "SampleFile.h"

namespace {

class RecordTest : public testing::Test {
  protected:
    void SetUp() override { ASSERT_EQ(CreateRows(database_, path_), 0); }

    DATABASE_HEADER HeaderOnDisk() const {
        DATABASE other(path_.c_str());
        DATABASE_HEADER header{};
        other.GetHeaderInfo(&header);
        return header;
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    DATABASE database_{nullptr};
};

TEST(Create, LaysOutColumns) {
    TemporaryFolder folder;
    DATABASE database(nullptr);
    const COLUMN_ENTRY columns[] = {Column("Name", ColumnType::String, 32),
                                    Column("Price", ColumnType::Float), Column("Wide", ColumnType::Byte, 7),
                                    Column("Rate", ColumnType::Float, 4, 0x35)};
    ASSERT_EQ(database.Create(folder.File("a.db").c_str(), "text", 4, columns), 0);
    DATABASE_HEADER header{};
    EXPECT_EQ(database.GetHeaderInfo(&header), 0);
    EXPECT_EQ(header.recordLength, 1 + 32 + 8 + 7 + 4);
    EXPECT_EQ(folder.Read("a.db").size(), 52U + 4 * 44);
    const struct {
        int size, offset, format;
    } expected[] = {{32, 0, 0}, {8, 32, 2}, {7, 40, 0}, {4, 47, 0x35}};
    for (int i = 0; i < 4; ++i) {
        COLUMN_ENTRY column{};
        EXPECT_EQ(database.GetColumnInfo(i, &column), 0);
        EXPECT_STREQ(column.name, columns[i].name);
        EXPECT_EQ(column.size, expected[i].size);
        EXPECT_EQ(column.offset, expected[i].offset);
        EXPECT_EQ(column.format, expected[i].format);
    }
    EXPECT_EQ(database.CalculateIOBufferSize(), 34 + 16 + 1 + 16 + 4);
    for (int index : {-1, 4}) {
        COLUMN_ENTRY column{};
        EXPECT_EQ(database.GetColumnInfo(index, &column), -1);
        EXPECT_EQ(database.GetLastError(nullptr), 1101);
    }
}

TEST_F(RecordTest, CreateRefusesAndKeepsWhatWasOpen) {
    const ROW row = Row("kept");
    ASSERT_EQ(database_.Append(&row), 0);
    const std::string before = folder_.Read("rows.db");
    const std::vector<COLUMN_ENTRY> fine = {Column("A", ColumnType::Byte)};
    const std::vector<COLUMN_ENTRY> tooWide(2, Column("A", ColumnType::String, 20000));
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
        {folder_.File("new.db"), {Column("A", ColumnType::String)}, 1110},
        {folder_.File("new.db"), {Column("A", ColumnType::String, 0)}, 1110},
        {folder_.File("new.db"), {Column("A", 9)}, 1110},
        {folder_.File("new.db"), tooWide, 1110},
        {folder_.File("new.db"), std::vector<COLUMN_ENTRY>(32768, fine[0]), 1110},
    };
    for (const auto& refused : cases) {
        EXPECT_EQ(database_.Create(refused.path.c_str(), "", static_cast<int>(refused.columns.size()),
                                   refused.columns.data()),
                  -1);
        EXPECT_EQ(database_.GetLastError(nullptr), refused.code) << refused.path;
        EXPECT_EQ(ContentOf(database_).size(), 1U);
    }
    EXPECT_EQ(folder_.Read("rows.db"), before);
    EXPECT_FALSE(folder_.Has("new.db"));
    DATABASE unmade(nullptr);
    EXPECT_EQ(unmade.Create(folder_.File("new.db").c_str(), "", -1, nullptr), -1);
    EXPECT_EQ(unmade.GetLastError(nullptr), 1110);
}

TEST_F(RecordTest, StatusByteDecidesWhatAnOperationMayDo) {
    const ROW row = Row("x");
    ROW got{};
    for (int i = 0; i < 3; ++i) {
        ASSERT_EQ(database_.Append(&row), i);
    }
    ASSERT_EQ(database_.Delete(1), 0);
    ASSERT_EQ(database_.Lock(2), 0);
    const std::function<long()> undo = [&] { return database_.UnDelete(1) + database_.Lock(2); };
    const struct {
        const char* what;
        std::function<long(long)> run;
        int active, deleted, locked, beyond; // error code, or 0 for success
    } cases[] = {
        {"Read", [&](long n) { return database_.Read(n, &got) - 1; }, 0, 1202, 0, 1201},
        {"UnBufferedRead", [&](long n) { return database_.UnBufferedRead(n, &got) - 1; }, 0, 1202, 0, 1201},
        {"IsLocked", [&](long n) { return database_.IsLocked(n) < 0 ? -1 : 0; }, 0, 2501, 0, 2502},
        {"Lock", [&](long n) { return database_.Lock(n); }, 0, 2301, 2303, 2302},
        {"UnLock", [&](long n) { return database_.UnLock(n); }, 2403, 2401, 0, 2402},
        {"Write", [&](long n) { return database_.Write(n, &row); }, 0, 1303, 0, 1302},
        {"Delete", [&](long n) { return database_.Delete(n); }, 0, 1403, 0, 1402},
        {"UnDelete", [&](long n) { return database_.UnDelete(n); }, 1503, 0, 1503, 1502},
    };
    const std::string start = folder_.Read("rows.db");
    for (const auto& operation : cases) {
        const std::pair<long, int> records[] = {{0, operation.active},
                                                {1, operation.deleted},
                                                {2, operation.locked},
                                                {3, operation.beyond},
                                                {-1, operation.beyond}};
        for (const auto& [number, code] : records) {
            folder_.Write("rows.db", start);
            ASSERT_EQ(database_.Open(path_.c_str()), 0);
            EXPECT_LE(operation.run(number), 0);
            EXPECT_EQ(database_.GetLastError(nullptr), code) << operation.what << " " << number;
            EXPECT_EQ(code != 0 && folder_.Read("rows.db") != start, false)
                << operation.what << " " << number;
        }
    }
}

TEST_F(RecordTest, CurrentRecordIsWhatUpdateWrites) {
    ROW row = Row("a");
    EXPECT_EQ(database_.Update(&row), -1);
    EXPECT_EQ(database_.GetLastError(nullptr), 2101);
    ASSERT_EQ(database_.Append(&row), 0);
    ASSERT_EQ(database_.Append(&row), 1);
    ASSERT_EQ(database_.Lock(0), 0);
    row = Row("b");
    EXPECT_EQ(database_.Update(&row), 0);
    EXPECT_EQ(database_.IsLocked(0), 0) << "writing takes the lock off";
    ROW got{};
    EXPECT_EQ(database_.Read(0, &got), 1);
    EXPECT_STREQ(got.name, "b");
    ASSERT_EQ(database_.Delete(1), 0);
    EXPECT_EQ(database_.Update(&row), -1);
    EXPECT_EQ(database_.GetLastError(nullptr), 2101);
    EXPECT_EQ(HeaderOnDisk().deletedCount, 1);
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), 1);
}

TEST_F(RecordTest, HeaderIsWrittenAtOnceUnlessSwitchedOff) {
    const ROW row = Row("a");
    ASSERT_EQ(database_.Append(&row), 0);
    EXPECT_EQ(HeaderOnDisk().recordCount, 1);
    ASSERT_EQ(database_.SetImmediateHeaderWrite(0), 0);
    ASSERT_EQ(database_.Append(&row), 1);
    ASSERT_EQ(database_.Delete(0), 0);
    EXPECT_EQ(HeaderOnDisk().recordCount, 1);
    EXPECT_EQ(HeaderOnDisk().deletedCount, 0);
    ASSERT_EQ(database_.SetImmediateHeaderWrite(1), 0);
    EXPECT_EQ(HeaderOnDisk().recordCount, 2);
    EXPECT_EQ(HeaderOnDisk().deletedCount, 1);
}

TEST_F(RecordTest, ErrorsStayUntilAsked) {
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
        EXPECT_EQ(database_.SetReadCache(kilobytes), -1);
        EXPECT_EQ(database_.GetLastError(nullptr), 2601);
    }
}

TEST(ClosedDatabase, AnswersSafely) {
    TemporaryFolder folder;
    for (const std::string& path :
         {std::string(), folder.File("none.db"), folder.Path(), folder.File(std::string(99, 'x'))}) {
        DATABASE database(path.empty() ? nullptr : path.c_str());
        EXPECT_EQ(database.GetLastError(nullptr), path.empty() ? 0 : 1103) << path;
        char data[64] = {};
        const struct {
            std::function<long()> run;
            int code;
        } cases[] = {
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
            {[&] { return database.Compress(0); }, 2709},
        };
        for (const auto& refused : cases) {
            EXPECT_EQ(refused.run(), -1);
            EXPECT_EQ(database.GetLastError(nullptr), refused.code);
        }
        EXPECT_EQ(database.SetImmediateHeaderWrite(0), 0);
        EXPECT_EQ(database.QueryReset(), 0);
        EXPECT_TRUE(Walked(database).empty());
        EXPECT_EQ(database.QueryGetLast(nullptr), nullptr);
        EXPECT_EQ(database.ConvertPhysToLogRecordNumber(0), -1);
        EXPECT_FALSE(folder.Has("none.db"));
    }
}

// What the file should hold, kept in plain memory.
struct MODEL {
    struct RECORD {
        ROW row;
        bool deleted = false;
    };
    std::vector<RECORD> records;

    std::vector<long> Active() const {
        std::vector<long> numbers;
        for (std::size_t i = 0; i < records.size(); ++i) {
            if (!records[i].deleted) {
                numbers.push_back(static_cast<long>(i));
            }
        }
        return numbers;
    }
};

void CompareWithModel(DATABASE& database, const MODEL& model) {
    for (std::size_t i = 0; i < model.records.size(); ++i) {
        ROW got{};
        ASSERT_EQ(database.Read(static_cast<long>(i), &got), model.records[i].deleted ? -1 : 1);
        if (!model.records[i].deleted) {
            ASSERT_EQ(BytesOf(got), BytesOf(model.records[i].row)) << i;
        }
    }
    ASSERT_EQ(database.QueryReset(), static_cast<long>(model.Active().size()));
    ASSERT_EQ(Walked(database), model.Active());
    std::vector<long> backwards;
    long number = 0;
    for (void* data = database.QueryGetLast(&number); data != nullptr;
         data = database.QueryGetPrev(&number)) {
        backwards.insert(backwards.begin(), number);
    }
    ASSERT_EQ(backwards, model.Active());
}

TEST_F(RecordTest, AgreesWithModelThroughRandomOperations) {
    const unsigned seed = std::random_device{}();
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    MODEL model;
    for (int round = 0; round < 2000; ++round) {
        const ROW row = Row("row " + std::to_string(round), 0, round % 100, round);
        const auto size = static_cast<unsigned>(model.records.size());
        const long n = size > 0 ? static_cast<long>(random() % size) : -1;
        MODEL::RECORD* record = n >= 0 ? &model.records[static_cast<std::size_t>(n)] : nullptr;
        switch (random() % (size < 300 ? 8 : 40)) {
        case 0:
        case 1:
            ASSERT_EQ(database_.Append(&row), static_cast<long>(size));
            model.records.push_back({row});
            break;
        case 2:
            if (record != nullptr) {
                ASSERT_EQ(database_.Delete(n), record->deleted ? -1 : 0);
                record->deleted = true;
            }
            break;
        case 3:
            if (record != nullptr) {
                ASSERT_EQ(database_.UnDelete(n), record->deleted ? 0 : -1);
                record->deleted = false;
            }
            break;
        case 4:
            ASSERT_EQ(database_.SetReadCache(static_cast<int>(std::vector{0, 1, 3, 256}[random() % 4])), 0);
            break;
        case 5:
            if (random() % 20 == 0) {
                ASSERT_EQ(database_.Compress(0), 0);
                std::erase_if(model.records, [](const auto& r) { return r.deleted; });
                CompareWithModel(database_, model);
            }
            break;
        default:
            if (record != nullptr) {
                ASSERT_EQ(database_.Write(n, &row), record->deleted ? -1 : 0);
                record->row = record->deleted ? record->row : row;
                ROW got{};
                ASSERT_EQ(database_.Read(n / 2, &got),
                          model.records[static_cast<std::size_t>(n) / 2].deleted ? -1 : 1);
            }
        }
        if (round % 100 == 99) {
            CompareWithModel(database_, model);
        }
    }
    ASSERT_EQ(database_.Open(path_.c_str()), 0);
    EXPECT_FALSE(database_.IsDamaged());
    CompareWithModel(database_, model);
}

} // namespace
