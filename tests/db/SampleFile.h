#pragma once

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
    COLUMN_ENTRY column{};
    std::strncpy(column.name, name, NameSize - 1);
    column.type = type;
    column.size = static_cast<std::int16_t>(size);
    column.format = format;
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
    ROW row{};
    name.copy(row.name, sizeof(row.name));
    row.tag = static_cast<std::int8_t>(tag);
    row.small = static_cast<std::int16_t>(small);
    row.count = count;
    row.price = price;
    row.day = day;
    row.at = at;
    return row;
}

inline int CreateRows(DATABASE& database, const std::string& path) {
    const auto columns = RowColumns();
    return database.Create(path.c_str(), "rows", static_cast<int>(columns.size()), columns.data());
}

inline std::string BytesOf(const ROW& row) {
    return {reinterpret_cast<const char*>(&row), sizeof(row)};
}

// What can be read of a file: the records' bytes, nothing where one is deleted.
using CONTENT = std::vector<std::optional<std::string>>;

inline CONTENT ContentOf(DATABASE& database) {
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    CONTENT content;
    for (long i = 0; i < header.recordCount; ++i) {
        std::string data(static_cast<std::size_t>(header.recordLength), '\0');
        content.emplace_back();
        if (database.Read(i, data.data()) == 1) {
            content.back() = data;
        }
    }
    database.GetLastError(nullptr);
    return content;
}

// The numbers of the result set's records in the order of the walk.
inline std::vector<long> Walked(DATABASE& database) {
    std::vector<long> numbers;
    long number = -1;
    for (void* data = database.QueryGetFirst(&number); data != nullptr;
         data = database.QueryGetNext(&number)) {
        numbers.push_back(number);
    }
    return numbers;
}
