#pragma once

#include <gtest/gtest.h>

#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "TemporaryFolder.h"
#include "db/Database.h"

// A record with a column of every type, as the engine takes it.
struct __attribute__((packed)) ROW {
    char name[16];
    std::int8_t tag;
    std::int16_t small;
    std::int32_t count;
    float price;
    dbDATE day;
    dbTIME at;
};

inline COLUMN_ENTRY Column(const char* name, std::int8_t type, int size = -1, int format = 0) {
    COLUMN_ENTRY column{{}, type, static_cast<std::int16_t>(size), 0, format};
    std::strncpy(column.name, name, NameSize - 1);
    return column;
}

inline std::vector<COLUMN_ENTRY> RowColumns() {
    return {Column("Name", ColumnType::String, 16), Column("Tag", ColumnType::Byte),
            Column("Small", ColumnType::Short),     Column("Count", ColumnType::Long),
            Column("Price", ColumnType::Float, 4),  Column("Day", ColumnType::Date),
            Column("At", ColumnType::Time)};
}

inline ROW Row(const std::string& name, int tag = 0, int small = 0, int count = 0, float price = 0,
               dbDATE day = {1, 1, 2000}, dbTIME at = {0, 0, 12}) {
    ROW row{{}, static_cast<std::int8_t>(tag), static_cast<std::int16_t>(small), count, price, day, at};
    name.copy(row.name, sizeof(row.name));
    return row;
}

inline int CreateRows(DATABASE& database, const std::string& path) {
    const auto columns = RowColumns();
    return database.Create(path.c_str(), "rows", static_cast<int>(columns.size()), columns.data());
}

// What queries and sorts go by in a column of numbers.
inline double KeyOf(const ROW& row, int column) {
    const double price = row.price;
    const double keys[] = {0,     row.tag * 1.0,           row.small * 1.0,       row.count * 1.0,
                           price, PackDate(row.day) * 1.0, PackTime(row.at) * 1.0};
    return keys[column];
}

// A file of rows of which record 1 is deleted and one is locked.
inline void MakeRows(const std::string& path, int count, long locked = 2) {
    DATABASE database(nullptr);
    ASSERT_EQ(CreateRows(database, path), 0);
    for (int i = 0; i < count; ++i) {
        const ROW row = Row("row " + std::to_string(i), 0, i % 140);
        ASSERT_EQ(database.Append(&row), i);
    }
    ASSERT_EQ(database.Delete(1) + database.Lock(locked), 0);
}

constexpr std::size_t FirstColumn = 52;
constexpr std::size_t DataStartOfRows = FirstColumn + 44 * 7;
constexpr std::size_t RowLength = sizeof(ROW) + 1;

inline std::string With(std::string bytes, std::size_t at, const std::string& other) {
    return bytes.replace(at, other.size(), other);
}

// The error code of an operation that failed with this result; 0 of one that succeeded without an error.
inline int Code(DATABASE& database, long result) {
    const int code = database.GetLastError(nullptr);
    EXPECT_EQ(result < 0, code != 0) << result << " and code " << code;
    EXPECT_STRNE(ErrorMessage(code), "Unknown error") << code;
    return code;
}

inline std::string BytesOf(const ROW& row) {
    return {reinterpret_cast<const char*>(&row), sizeof(row)};
}

inline std::string NameOf(const ROW& row) {
    return {row.name, strnlen(row.name, sizeof(row.name))};
}

// What is done, and what comes of it.
using CASES = std::vector<std::pair<std::string, std::string>>;

// What can be read of a file: the records' bytes, nothing where one is deleted.
using CONTENT = std::vector<std::optional<std::string>>;

inline CONTENT ContentOf(DATABASE& database) {
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    CONTENT content;
    for (long i = 0; i < header.recordCount; ++i) {
        std::string data(static_cast<std::size_t>(header.recordLength) - 1, '\0');
        content.emplace_back();
        if (database.Read(i, data.data()) == 1)
            content.back() = data;
    }
    database.GetLastError(nullptr);
    return content;
}

// A row's field as text.
inline std::string FieldOf(const DATABASE& database, const ROW& row, int column) {
    std::string text;
    database.FormatRecordData(&text, &row, "\n");
    std::istringstream fields(text);
    for (int i = 0; i <= column; ++i)
        std::getline(fields, text);
    return text;
}

// The numbers of the result set's records in the order of the walk.
inline std::vector<long> Walked(DATABASE& database) {
    std::vector<long> numbers;
    long number = -1;
    for (void* data = database.QueryGetFirst(&number); data != nullptr; data = database.QueryGetNext(&number))
        numbers.push_back(number);
    return numbers;
}

// A new file of rows.
class RowsTest : public testing::Test {
  protected:
    RowsTest() { EXPECT_EQ(CreateRows(database_, path_), 0); }

    void Append(const std::vector<ROW>& rows) {
        EXPECT_GE(database_.AppendAll(rows.data(), sizeof(ROW), static_cast<std::int32_t>(rows.size())), 0);
    }
    int CodeOf(long result) { return Code(database_, result); }
    ROW At(long n) {
        ROW row{};
        EXPECT_EQ(database_.UnBufferedRead(n, &row), 1) << n;
        return row;
    }

    TemporaryFolder folder_;
    std::string path_ = folder_.File("rows.db");
    DATABASE database_{nullptr};
};
