#include <random>

#include "SampleFile.h"
#include "Shell.h"

namespace {

TEST_F(RowsTest, FileIsAsDocumented) {
    const std::vector columns = {Column("Name", ColumnType::String, 8), Column("Price", ColumnType::Float),
                                 Column("Bought", ColumnType::Date), Column("Sold", ColumnType::Time)};
    ASSERT_EQ(database_.Create(folder_.File("a.db").c_str(), "example", 4, columns.data()), 0);
    texts_.Write("text", "Acorn\t12.25\t19990105\t091530\nBirch\t12.25\t19990105\t091530\n");
    Play("load \t\n: 2; delete 0: 0; lock 1: 0");
    // The document's dump has lines of an offset, 1 to 16 bytes and their characters.
    EXPECT_EQ(Output("od -v -Ax -tx1 " + folder_.File("a.db") + " | sed 's/^/00/; s/ //g; $d'"),
              Output("sed -nE 's/^([0-9a-f]{8}  [^|]*).*/\\1/; T; s/ //gp' " DATA_FILE_DOCUMENT));
}

TEST_F(RowsTest, CreateLaysOutColumns) {
    using namespace ColumnType;
    Create("a.db", {Column("Name", String, 32), Column("Price", Float), Column("Wide", Byte, 7),
                    Column("Rate", Float, 4, 0x35)});
    COLUMN_ENTRY rate{};
    EXPECT_EQ(database_.GetColumnInfo(3, &rate), 0);
    EXPECT_EQ(std::tuple(rate.name, +rate.size, +rate.offset, +rate.format),
              std::tuple(std::string("Rate"), 4, 47, 0x35));
    EXPECT_EQ(database_.CalculateIOBufferSize(), 34 + 16 + 1 + 16 + 4);
    for (const int index : {-1, 4})
        EXPECT_EQ(Code(database_.GetColumnInfo(index, &rate)), 1101);
}

TEST_F(RowsTest, CreateRefusesAndKeepsWhatWasOpen) {
    Append({newRow_});
    const std::string before = folder_.Read("rows.db");
    const std::string fresh = folder_.File("new.db");
    const std::tuple<std::string, int, int, int> cases[] = {{path_, 1, 1, 1102}, // columns of that width
                                                            {"", 1, 1, 1109},
                                                            {folder_.File("missing/new.db"), 1, 1, 1109},
                                                            {folder_.File(std::string(128, 'x')), 1, 1, 1109},
                                                            {fresh, 1, -1, 1110},
                                                            {fresh, 2, 20000, 1110},
                                                            {fresh, 32768, 1, 1110},
                                                            {fresh, -1, 1, 1110}};
    for (const auto& [path, count, width, code] : cases) {
        const std::vector columns(static_cast<std::size_t>(std::abs(count)),
                                  Column("A", ColumnType::String, width));
        EXPECT_EQ(Code(database_.Create(path.c_str(), "", count, columns.data())), code) << path;
        EXPECT_EQ(ContentOf(database_).size(), 1U);
    }
    const COLUMN_ENTRY unknown = Column("A", 9), known = Column("A", ColumnType::Long);
    EXPECT_EQ(Code(database_.Create(fresh.c_str(), "", 1, &unknown)), 1110);
    for (int call = 0; call < 3; ++call) {
        files_.Arm(Fault::HalfThenError, call);
        EXPECT_EQ(Code(database_.Create(fresh.c_str(), "", 1, &known)), 1109);
        EXPECT_TRUE(files_.Disarm());
        EXPECT_FALSE(folder_.Has("new.db"));
    }
    EXPECT_EQ(folder_.Read("rows.db"), before);
}

TEST_F(RowsTest, OperationsByStatus) {
    // On a record that is active, deleted or locked and on a number outside of the file; then the status of
    // the three, and which record is current: that one (#), none (-) or the one before (=).
    const std::tuple<std::string, std::array<int, 4>, const char*> cases[] = {
        {"read ", {1, 1202, 1, 1201}, "012#"},        {"read-file ", {1, 1202, 1, 1201}, "012#"},
        {"write ", {0, 1303, 0, 1302}, "010#"},       {"delete ", {0, 1403, 0, 1402}, "111-"},
        {"undelete ", {1503, 0, 1503, 1502}, "002#"}, {"lock ", {0, 2301, 2303, 2302}, "212#"},
        {"unlock ", {2403, 2401, 0, 2402}, "010#"},   {"is-locked ", {0, 2501, 1, 2502}, "012="}};
    Append(std::vector<ROW>(4, newRow_));
    Play("delete 1: 0; lock 2: 0");
    const std::string start = folder_.Read("rows.db");
    const ROW mark = Row("mark");
    const auto record = [](long n) { return DataStartOfRows + static_cast<std::size_t>(n) * RowLength; };
    for (const auto& [operation, answers, after] : cases) {
        for (const long n : {0L, 1L, 2L, 4L, -1L, 1L << 32}) {
            SCOPED_TRACE(operation + std::to_string(n));
            ASSERT_EQ(Open(start), 0);
            Play(n == 2 ? "cache 256: 0; read 3: 1" : "cache 0: 0; read 3: 1");
            const bool inside = n >= 0 && n < 3;
            const int answer = answers[inside ? static_cast<std::size_t>(n) : 3];
            EXPECT_EQ(Run(operation + std::to_string(n)), answer);
            std::string expected = start;
            if (inside) {
                expected[record(n)] = static_cast<char>(after[n] - '0');
                expected[40] = static_cast<char>((n == 1 ? 0 : 1) + (after[n] == '1' ? 1 : 0));
            }
            EXPECT_EQ(folder_.Read("rows.db"), expected);
            const char current = answer < 1000 ? after[3] : '=';
            EXPECT_EQ(Code(database_.Update(&mark)), current == '-' ? 2101 : 0);
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
    std::size_t n = 0, step = 1;
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
    Play("read 49: 1209");
}

TEST_F(RowsTest, CountsAreWrittenAtOnceOrWhenAskedFor) {
    const auto counts = [this] {
        const std::string header = folder_.Read("rows.db");
        return std::tuple(header[36], header[40], header[48]);
    };
    Play("append: 0; append: 1");
    EXPECT_EQ(counts(), std::tuple('\2', '\0', '\0'));
    Play("headers 0: 0; append: 2; delete 0: 0");
    EXPECT_EQ(database_.GetNumberOfActiveRecords(), 2);
    files_.Arm(Fault::Error, 0);
    Play("append-all: 2801");
    EXPECT_TRUE(files_.Disarm());
    EXPECT_EQ(counts(), std::tuple('\2', '\0', '\0')) << "not after a failure either";
    Play("headers 1: 0");
    EXPECT_EQ(counts(), std::tuple('\3', '\1', '\0'));
}

TEST_F(RowsTest, ErrorsStayUntilAsked) {
    char message[ErrorMessageSize];
    database_.Delete(7);
    database_.Read(7, message);
    EXPECT_EQ(database_.SetReadCache(0), 0) << "a success changes nothing";
    EXPECT_EQ(database_.GetLastError(message), 1201);
    EXPECT_STREQ(message, "Read error - ivalid record number");
    EXPECT_EQ(database_.GetLastError(message), 0);
    EXPECT_STREQ(message, "No error");
    EXPECT_STREQ(ErrorMessage(65535), "Unknown error");
    Play("cache -1: 2601; cache " + std::to_string(ReadCache::MaximumKilobytes + 1) + ": 2601");
}

TEST_F(RowsTest, AnswersSafelyWhenClosed) {
    for (const std::string& path :
         {folder_.File("none.db"), folder_.Path(), folder_.File(std::string(99, 'x'))}) {
        EXPECT_EQ(Code(database_.Open(path.c_str())), 1103) << path;
        Play("append: 2802; read 0: 1201; headers 1: 2901; new Name = x: 1602; sort Name: 1701; "
             "compress: 2709; export 1: 1908; load \t\n: 1808; headers 0: 0; reset: 0; sync: 0");
        EXPECT_EQ(Code(database_.Update(&newRow_)), 2101);
        EXPECT_TRUE(Walked().empty());
        EXPECT_EQ(database_.ConvertPhysToLogRecordNumber(0), -1);
        EXPECT_EQ(folder_.Names().size(), 1U);
    }
}

} // namespace
