#include <algorithm>

#include <sys/stat.h>

#include "SampleFile.h"
#include "db/FileCheck.h"

namespace {

// A file of four records of which one is deleted and one locked, whose bytes are damaged.
class DamageTest : public testing::Test {
  protected:
    DamageTest() {
        MakeRows(path_, 4);
        intact_ = folder_.Read("rows.db");
    }

    // Opens a file of these bytes, reads all that can be read, and tells how many records that were.
    long Examine(const std::string& bytes) {
        // A fresh file is not flushed when it is closed, as a rewritten one may be.
        std::filesystem::remove(path_);
        folder_.Write("rows.db", bytes);
        DATABASE database(path_.c_str());
        long readable = 0;
        for (const auto& record : ContentOf(database)) {
            readable += record ? 1 : 0;
        }
        for (const char* statement : {"Name contains o", "Tag = 1", "Small > 0", "Count < 9", "Price != 1",
                                      "Day > 19990101", "At < 120000", ""}) {
            database.Query(statement, QueryMode::New);
            Walked(database);
        }
        if (!database.IsOpen()) {
            readable = -1;
        } else if (database.IsDamaged()) {
            EXPECT_EQ(Code(database, database.Compress(0)), 2708);
        }
        EXPECT_EQ(folder_.Read("rows.db"), bytes) << "looking at a file must not change it";
        return readable;
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    std::string intact_;
};

TEST_F(DamageTest, TruncatedAnywhere) {
    EXPECT_EQ(Examine(intact_), 3);
    for (std::size_t size = 0; size < intact_.size(); ++size) {
        const long whole =
            size < DataStartOfRows ? -1 : static_cast<long>((size - DataStartOfRows) / RowLength);
        EXPECT_EQ(Examine(intact_.substr(0, size)), whole >= 2 ? whole - 1 : whole) << size;
    }
}

TEST_F(DamageTest, AnyByteOfHeaderAndColumns) {
    for (std::size_t at = 0; at < DataStartOfRows; ++at) {
        for (char other : {'\x00', '\x01', '\x03', '\x7F', '\x80', '\xFF'}) {
            EXPECT_LE(Examine(With(intact_, at, std::string(1, other))), 400) << at;
        }
    }
}

// What is left to repair: remarks, problems, nothing but counts.
enum Kind { Sound, Broken, Mended };

// What the check says of a file's bytes, and what is left of them when the counts are mended.
void CheckAndRepair(const TemporaryFolder& folder, const std::string& bytes, Kind kind,
                    const FILE_FINDING& expected) {
    const std::string path = folder.File("rows.db");
    FileCheck check;
    ASSERT_EQ(check.Run(path), 0);
    EXPECT_EQ(check.IsSound(), kind == Sound);
    EXPECT_EQ(check.CanRepair(), kind == Mended);
    ASSERT_EQ(check.Findings().empty(), expected.text.empty());
    const auto found = std::find_if(
        check.Findings().begin(), check.Findings().end(), [&expected](const FILE_FINDING& finding) {
            return finding.offset == expected.offset && finding.text.find(expected.text) != std::string::npos;
        });
    if (!expected.text.empty()) {
        ASSERT_NE(found, check.Findings().end())
            << check.Findings().front().offset << " " << check.Findings().front().text;
        EXPECT_EQ(found->record, expected.record);
        EXPECT_EQ(found->problem, kind != Sound);
    }
    EXPECT_EQ(folder.Read("rows.db"), bytes) << "looking must not change anything";
    std::string backup;
    ASSERT_EQ(check.Repair(path, &backup), 0);
    EXPECT_EQ(check.IsSound(), kind != Broken);
    EXPECT_FALSE(check.CanRepair());
    const std::string mended = folder.Read("rows.db");
    if (kind == Mended) {
        EXPECT_EQ(backup, path + ".before-repair");
        EXPECT_EQ(folder.Read("rows.db.before-repair"), bytes);
        EXPECT_EQ(With(mended, 36, bytes.substr(36, 16)), bytes) << "only counts may change";
        const DATABASE database(path.c_str());
        EXPECT_TRUE(database.IsOpen() && !database.IsDamaged());
        std::filesystem::remove(backup);
    } else {
        EXPECT_EQ(mended, bytes);
        EXPECT_EQ(folder.Names(), std::vector<std::string>{"rows.db"});
    }
}

TEST_F(DamageTest, IsReadAsFarAsItGoesAndToldOf) {
    const std::string ff2 = "\xFF\xFF";
    const std::string zero2(2, '\0');
    const std::string name32(32, 'n');
    constexpr std::size_t column = FirstColumn;
    constexpr std::size_t count = FirstColumn + 44 * 3; // the column Count
    constexpr std::size_t second = DataStartOfRows + RowLength;
    const auto size = static_cast<std::int64_t>(intact_.size());
    const struct {
        std::string bytes;
        long readable; // records; -1: refused
        bool damaged;
        Kind kind;
        std::int64_t offset; // of a finding
        const char* text;    // in that finding; empty when there is none
        std::int32_t record = -1;
        long active = std::max(readable, 0L); // as the counts say
    } cases[] = {
        {intact_, 3, false, Sound, -1, ""},
        {"", -1, false, Broken, 0, "0 of the header's 52 bytes"},
        {intact_.substr(0, 51), -1, false, Broken, 51, "51 of the header's"},
        {intact_.substr(0, 359), -1, false, Broken, 44, "7 columns need 360 bytes, the file has 359"},
        {intact_.substr(0, 360), 0, true, Mended, 36, "counts 4 records, the file has room for 0"},
        {intact_.substr(0, intact_.size() - 1), 2, true, Mended, 36, "4 records, the file has room for 3"},
        {With(intact_, 36, std::string(4, '\0')), 0, true, Mended, 36, "0 records, the file has room for 4"},
        {With(intact_, 36, "\x01"), 1, true, Mended, 36, "counts 1 record, the file has room for 4", -1, 0},
        {With(intact_, 36, "\x03"), 2, false, Sound, size - 35, "35 bytes behind the last record"},
        {With(intact_, 36, ff2 + ff2), -1, false, Mended, 36, "counts -1 records"},
        {With(intact_, 36, ff2 + "\xFF\x7F"), 3, true, Mended, 36, "room for 4"}, // absurdly many
        {With(intact_, 40, ff2 + ff2), 3, true, Mended, 40, "counts -1 deleted"},
        {With(intact_, 40, "\x02"), 3, false, Mended, 40, "counts 2 deleted, the status bytes 1", -1, 2},
        {With(intact_, 40, "\x05"), 3, true, Mended, 40, "counts 5 deleted"},
        {With(intact_, second, zero2.substr(1)), 4, false, Mended, 40, "1 deleted, the status bytes 0", -1,
         3},
        {With(intact_, 44, ff2), -1, false, Broken, 44, "column count is -1"},
        {With(intact_, 44, "\xFF\x7F"), -1, false, Broken, 44, "columns need"},
        {With(intact_, 44, "\x08"), -1, false, Broken, column + 44 * 7 + 36, "outside the 34"},
        {With(intact_, 46, zero2), -1, false, Broken, 46, "record length is 0"},
        {With(intact_, 46, ff2), -1, false, Broken, 46, "record length is -1"},
        {With(intact_, 46, "\x22"), -1, false, Broken, column + 44 * 6 + 36, "At has 3 bytes at 31"},
        {With(intact_, column + 34, ff2), -1, false, Broken, column + 36, "Name has -1 bytes"},
        {With(intact_, column + 36, ff2), -1, false, Broken, column + 36, "bytes at -1"},
        {With(intact_, column + 36, "\x13"), -1, false, Broken, column + 36,
         "bytes at 19"}, // and ends behind
        {With(intact_, column + 34, "\x23"), -1, false, Broken, column + 36, "Name has 35 bytes"},
        {With(intact_, column + 32, "\x63"), 3, false, Broken, column + 32, "unknown type 99"},
        {With(intact_, column + 36, "\x09"), 3, false, Broken, column + 44 + 36, "Tag begins at byte 16"},
        {With(intact_, column + 34, "\x11"), 3, false, Broken, column + 44 + 36, "column Tag begins at"},
        {With(With(intact_, 4, name32), column, name32), 3, false, Broken, column, "name without an end"},
        {With(intact_, count + 34, "\x01"), 3, false, Sound, count + 44 + 36, "Price begins at byte 23"},
        {With(intact_, count + 34, zero2.substr(1)), 3, false, Sound, count + 44 + 36,
         "columns before it end at 19"},
        {With(intact_, DataStartOfRows, "\x55"), 3, false, Broken, DataStartOfRows, "byte is 85", 0},
        {With(intact_, 0, ff2), 3, false, Sound, 0, "version"},
        {With(intact_, 4, name32), 3, false, Sound, 4, "description"},
        {With(intact_, column + 44, "Name"), 3, false, Sound, column + 44, "column Name has the name"},
        {With(intact_, column + 34, "\x0F"), 3, false, Sound, column + 44 + 36, "Tag begins at byte 16"},
        {With(intact_, 44, "\x06").erase(52 + 44 * 6, 44), 3, false, Sound, 46, "covers the last 3 bytes"},
        {intact_ + "abc", 3, false, Sound, size, "3 bytes behind the last"},
        {With(intact_ + std::string(2 * RowLength, 'x'), 48, "\x02"), 3, false, Sound, 48,
         "reserved field is 2"},
    };
    for (const auto& damage : cases) {
        SCOPED_TRACE(testing::Message() << "case " << &damage - cases << ": " << damage.text);
        EXPECT_EQ(Examine(damage.bytes), damage.readable);
        {
            DATABASE database(path_.c_str());
            EXPECT_EQ(database.IsDamaged(), damage.damaged);
            EXPECT_EQ(database.GetLastError(nullptr), damage.readable < 0 ? 1103 : 0);
            EXPECT_EQ(database.GetNumberOfActiveRecords(), damage.active);
            DATABASE_HEADER header{};
            database.GetHeaderInfo(&header);
            EXPECT_LT(std::strlen(header.description), 32U);
        }
        CheckAndRepair(folder_, damage.bytes, damage.kind,
                       {.offset = damage.offset, .record = damage.record, .text = damage.text});
    }
}

TEST_F(DamageTest, AppendKeepsRecordsBehindTheCountedOnes) {
    folder_.Write("rows.db", With(intact_, 36, "\x01"));
    DATABASE database(path_.c_str());
    const ROW row = Row("new");
    EXPECT_EQ(Code(database, database.Append(&row)), 2803);
    EXPECT_EQ(folder_.Read("rows.db"), With(intact_, 36, "\x01"));
}

TEST_F(DamageTest, CountThatIsTooLowStaysInItsRange) {
    folder_.Write("rows.db", With(intact_, 40, std::string(1, '\0')));
    DATABASE database(path_.c_str());
    EXPECT_EQ(database.UnDelete(1), 0);
    EXPECT_EQ(database.GetNumberOfActiveRecords(), 4);
}

TEST_F(DamageTest, NarrowColumnsAreNotReadPastTheirEnd) {
    std::string bytes = With(intact_, FirstColumn + 44 * 3 + 34, "\x02"); // Count keeps 2 of its 4 bytes
    for (std::size_t i = 0; i < 4; ++i) {
        bytes = With(bytes, DataStartOfRows + i * RowLength + 1 + 19, "\x05\x01\x09\x09");
    }
    folder_.Write("rows.db", bytes);
    DATABASE database(path_.c_str());
    EXPECT_EQ(database.Query("Count = 261", QueryMode::New), 3);
}

TEST_F(DamageTest, FileThatShrinksWhileOpen) {
    DATABASE database(path_.c_str());
    const long selected = database.Query("Name >= a", QueryMode::New);
    ASSERT_GT(selected, 1);
    database.SetReadCache(256);
    std::filesystem::resize_file(path_, DataStartOfRows + RowLength / 2);
    const ROW row = Row("x");
    ROW got{};
    EXPECT_EQ(Code(database, database.SortBy("Name", 0)), 1709);
    for (int all : {0, 1}) {
        EXPECT_EQ(Code(database, database.Export(folder_.File("rows.txt").c_str(), all, "\t")), 1907);
    }
    EXPECT_EQ(Code(database, database.Read(3, &got)), 1209);
    EXPECT_EQ(Code(database, database.Write(3, &row)), 1309);
    EXPECT_EQ(Code(database, database.Query("Tag = 1", QueryMode::New)), 1609);
    EXPECT_EQ(database.QueryGetFirst(nullptr), nullptr);
    EXPECT_EQ(Code(database, database.Compress(0)), 2707);
    EXPECT_FALSE(folder_.Has("rows.new"));
}

TEST_F(DamageTest, WhatIsNoFileIsRefused) {
    ASSERT_EQ(mkfifo(folder_.File("pipe").c_str(), 0600), 0);
    for (const std::string& path : {folder_.File("pipe"), folder_.Path(), std::string("/dev/zero")}) {
        DATABASE database(path.c_str());
        EXPECT_FALSE(database.IsOpen());
        EXPECT_EQ(database.GetLastError(nullptr), 1103);
    }
}

} // namespace
