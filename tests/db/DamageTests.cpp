#include <gtest/gtest.h>

#include <algorithm>

#include <sys/stat.h>

#include "SampleFile.h"

namespace {

constexpr std::size_t DataStartOfRows = 52 + 44 * 7;
constexpr std::size_t Length = sizeof(ROW) + 1;

// Builds a file of four records of which one is deleted, damages its bytes, reopens it and looks what is
// there.
class DamageTest : public testing::Test {
  protected:
    void SetUp() override {
        DATABASE database(nullptr);
        ASSERT_EQ(CreateRows(database, path_), 0);
        for (int i = 0; i < 4; ++i) {
            const ROW row = Row("row " + std::to_string(i));
            ASSERT_EQ(database.Append(&row), i);
        }
        ASSERT_EQ(database.Delete(1), 0);
        intact_ = folder_.Read("rows.db");
        ASSERT_EQ(intact_.size(), DataStartOfRows + 4 * Length);
    }

    static std::string With(std::string bytes, std::size_t at, const std::string& other) {
        return bytes.replace(at, other.size(), other);
    }

    // Opens a file of these bytes, reads all that can be read, and tells how many records that were.
    long Examine(const std::string& bytes) {
        std::filesystem::remove(
            path_); // a fresh file is not flushed when it is closed, as a rewritten one may be
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
            EXPECT_EQ(database.Compress(0), -1);
            EXPECT_EQ(database.GetLastError(nullptr), 2708);
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
        const long whole = size < DataStartOfRows ? -1 : static_cast<long>((size - DataStartOfRows) / Length);
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

TEST_F(DamageTest, IsRefusedOrReadAsFarAsItGoes) {
    const std::string ff2 = "\xFF\xFF";
    const std::string name32(32, 'n');
    constexpr std::size_t column = 52;
    const struct {
        const char* what;
        std::string bytes;
        long readable; // records; -1: refused
        bool damaged;
    } cases[] = {
        {"no records counted that are there", With(intact_, 36, std::string(4, '\0')), 0, true},
        {"one record more than counted", With(intact_, 36, "\x03"), 2, false},
        {"trailing bytes", intact_ + "abc", 3, false},
        {"negative record count", With(intact_, 36, ff2 + ff2), -1, false},
        {"absurd record count", With(intact_, 36, ff2 + "\xFF\x7F"), 3, true},
        {"negative deleted count", With(intact_, 40, ff2 + ff2), 3, true},
        {"more deleted than there are", With(intact_, 40, "\x05"), 3, true},
        {"negative column count", With(intact_, 44, ff2), -1, false},
        {"columns beyond the file", With(intact_, 44, "\xFF\x7F"), -1, false},
        {"records of no length", With(intact_, 46, std::string(2, '\0')), -1, false},
        {"records of negative length", With(intact_, 46, ff2), -1, false},
        {"records shorter than columns", With(intact_, 46, std::string("\x22\0", 2)), -1, false},
        {"negative size", With(intact_, column + 34, ff2), -1, false},
        {"negative offset", With(intact_, column + 36, ff2), -1, false},
        {"offset beyond the record", With(intact_, column + 36, "\x13"), -1, false},
        {"size beyond the record", With(intact_, column + 34, "\x23"), -1, false},
        {"names without end", With(With(intact_, 4, name32), column, name32), 3, false},
        {"unknown type", With(intact_, column + 32, "\x63"), 3, false},
        {"long of one byte", With(intact_, column + 44 * 3 + 34, "\x01"), 3, false},
        {"no size", With(intact_, column + 44 * 3 + 34, std::string(1, '\0')), 3, false},
        {"unknown version", With(intact_, 0, ff2), 3, false},
        {"unknown status byte", With(intact_, DataStartOfRows, "\x55"), 3, false},
    };
    for (const auto& damage : cases) {
        EXPECT_EQ(Examine(damage.bytes), damage.readable) << damage.what;
        DATABASE database(path_.c_str());
        EXPECT_EQ(database.IsDamaged(), damage.damaged) << damage.what;
        EXPECT_EQ(database.GetLastError(nullptr), damage.readable < 0 ? 1103 : 0) << damage.what;
        DATABASE_HEADER header{};
        database.GetHeaderInfo(&header);
        EXPECT_EQ(database.GetNumberOfActiveRecords(), std::max(damage.readable, 0L)) << damage.what;
        EXPECT_LT(std::strlen(header.description), 32U);
    }
}

TEST_F(DamageTest, AppendKeepsRecordsBehindTheCountedOnes) {
    folder_.Write("rows.db", With(intact_, 36, "\x01"));
    DATABASE database(path_.c_str());
    const ROW row = Row("new");
    EXPECT_EQ(database.Append(&row), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 2803);
    EXPECT_EQ(folder_.Read("rows.db"), With(intact_, 36, "\x01"));
}

TEST_F(DamageTest, NarrowColumnsAreNotReadPastTheirEnd) {
    std::string bytes = With(intact_, 52 + 44 * 3 + 34, "\x02"); // Count keeps 2 of its 4 bytes
    for (std::size_t i = 0; i < 4; ++i) {
        bytes = With(bytes, DataStartOfRows + i * Length + 1 + 19, "\x05\x01\x09\x09");
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
    std::filesystem::resize_file(path_, DataStartOfRows + Length / 2);
    const ROW row = Row("x");
    ROW got{};
    EXPECT_EQ(database.SortBy("Name", 0), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 1709);
    for (int all : {0, 1}) {
        EXPECT_EQ(database.Export(folder_.File("rows.txt").c_str(), all, "\t"), -1);
        EXPECT_EQ(database.GetLastError(nullptr), 1907);
    }
    EXPECT_EQ(database.Read(3, &got), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 1209);
    EXPECT_EQ(database.Write(3, &row), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 1309);
    EXPECT_EQ(database.Query("Tag = 1", QueryMode::New), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 1609);
    EXPECT_EQ(database.QueryGetFirst(nullptr), nullptr);
    EXPECT_EQ(database.Compress(0), -1);
    EXPECT_EQ(database.GetLastError(nullptr), 2707);
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
