#pragma once

#include <cstring>
#include <map>
#include <optional>
#include <sstream>
#include <vector>

#include "FaultyFiles.h"
#include "TemporaryFolder.h"

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

inline const std::vector<COLUMN_ENTRY> RowColumns = {
    Column("Name", ColumnType::String, 16), Column("Tag", ColumnType::Byte),
    Column("Small", ColumnType::Short),     Column("Count", ColumnType::Long),
    Column("Price", ColumnType::Float, 4),  Column("Day", ColumnType::Date),
    Column("At", ColumnType::Time)};

inline ROW Row(const std::string& name, int tag = 0, int small = 0, int count = 0, float price = 0,
               dbDATE day = {1, 1, 2000}, dbTIME at = {0, 0, 12}) {
    ROW row{{}, static_cast<std::int8_t>(tag), static_cast<std::int16_t>(small), count, price, day, at};
    name.copy(row.name, sizeof(row.name));
    return row;
}

// Whether a comparison of two rows' fields holds, as queries and sorts make it.
inline bool Holds(int op, const ROW& row, const ROW& other, int column) {
    static const DATABASE rules(nullptr);
    const auto text = [](const ROW& of) { return std::string(of.name, strnlen(of.name, sizeof of.name)); };
    const auto number = [column](const ROW& of) {
        const double price = of.price;
        const double keys[] = {of.tag * 1.0, of.small * 1.0,         of.count * 1.0,
                               price,        PackDate(of.day) * 1.0, PackTime(of.at) * 1.0};
        return keys[column - 1];
    };
    return column == 0 ? rules.CompareStringVals(op, text(row).c_str(), text(other).c_str()) != 0
                       : rules.CompareVals(op, number(row), number(other)) != 0;
}

constexpr std::size_t FirstColumn = 52;
constexpr std::size_t DataStartOfRows = FirstColumn + 44 * 7;
constexpr std::size_t RowLength = sizeof(ROW) + 1;

inline std::string With(std::string bytes, std::size_t at, const std::string& other) {
    return bytes.replace(at, other.size(), other);
}

inline std::string BytesOf(const ROW& row) {
    return {reinterpret_cast<const char*>(&row), sizeof(row)};
}

// Of "new Tag > 0: 3; sort name: 1701" and the like, each step and what comes of it.
inline std::vector<std::pair<std::string, std::string>> Cases(const std::string& script) {
    std::vector<std::pair<std::string, std::string>> cases;
    std::istringstream steps(script);
    for (std::string step; std::getline(steps >> std::ws, step, ';');) {
        const std::size_t colon = step.rfind(": ");
        cases.emplace_back(step.substr(0, colon), step.substr(colon + 2));
    }
    return cases;
}

// What can be read of a file: the records' bytes, nothing where one is deleted.
using CONTENT = std::vector<std::optional<std::string>>;

inline CONTENT ContentOf(DATABASE& database) {
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    CONTENT content(static_cast<std::size_t>(header.recordCount));
    for (std::size_t i = 0; i < content.size(); ++i) {
        std::string data(static_cast<std::size_t>(header.recordLength) - 1, '\0');
        if (database.Read(static_cast<long>(i), data.data()) == 1)
            content[i] = data;
    }
    database.GetLastError(nullptr);
    return content;
}

// An empty file of rows, open, in a folder of its own, and what is done with it.
class RowsTest : public testing::Test {
  protected:
    RowsTest() { Create(); }

    void Create(const std::string& name = "rows.db", const std::vector<COLUMN_ENTRY>& columns = RowColumns) {
        const int count = static_cast<int>(columns.size());
        EXPECT_EQ(database_.Create(folder_.File(name).c_str(), "", count, columns.data()), 0);
    }
    void Append(const std::vector<ROW>& rows) {
        EXPECT_GE(database_.AppendAll(rows.data(), sizeof(ROW), static_cast<std::int32_t>(rows.size())), 0);
    }
    // The file, with so many rows of which record 1 is deleted and one is locked.
    void MakeRows(int count, long locked = 2) {
        folder_.Clear();
        Create();
        for (int i = 0; i < count; ++i)
            Append({Row("row " + std::to_string(i), 0, i % 140)});
        EXPECT_EQ(database_.Delete(1) + database_.Lock(locked), 0);
    }
    // The file with other bytes. A fresh one is not flushed when it is closed, as a rewritten one may be.
    int Open(const std::string& bytes) {
        std::filesystem::remove(path_);
        folder_.Write("rows.db", bytes);
        return database_.Open(path_.c_str());
    }
    // The error's code of an operation with this result; 0 of one that succeeded without an error.
    int Code(long result) {
        const int code = database_.GetLastError(nullptr);
        EXPECT_EQ(result < 0, code != 0) << result << " and code " << code;
        EXPECT_STRNE(ErrorMessage(code), "Unknown error") << code;
        return code;
    }
    // Does a step in words: its result, or its error's code.
    long Run(const std::string& step) {
        std::istringstream words(step);
        std::string operation, rest;
        std::getline(words, operation, ' ');
        std::getline(words, rest, '\0');
        const char* text = rest.c_str();
        const long n = std::atol(text);
        ROW row = newRow_;
        const ROW three[] = {newRow_, Row("newer", 5, 6, 7, 8), newRow_};
        const std::string separator(300, '-');
        const std::map<std::string, std::function<long()>> operations = {
            {"new", [&] { return database_.Query(text, QueryMode::New); }},
            {"and", [&] { return database_.Query(text, QueryMode::And); }},
            {"or", [&] { return database_.Query(text, QueryMode::Or); }},
            {"reset", [&] { return database_.QueryReset(); }},
            {"refresh", [&] { return database_.QueryRefresh(), 0; }},
            {"sort", [&] { return database_.SortBy(text, 0); }},
            {"change", [&] { return database_.QueryUpdate(text); }},
            {"append", [&] { return database_.Append(&row); }},
            {"append-all", [&] { return database_.AppendAll(three, sizeof row, 3); }},
            {"read", [&] { return database_.Read(n, &row); }},
            {"read-file", [&] { return database_.UnBufferedRead(n, &row); }},
            {"write", [&] { return database_.Write(n, &row); }},
            {"delete", [&] { return database_.Delete(n); }},
            {"undelete", [&] { return database_.UnDelete(n); }},
            {"lose", [&] { return DATABASE(path_.c_str()).Delete(n); }}, // another deletes it
            {"lock", [&] { return database_.Lock(n); }},
            {"unlock", [&] { return database_.UnLock(n); }},
            {"is-locked", [&] { return database_.IsLocked(n); }},
            {"cache", [&] { return database_.SetReadCache(static_cast<int>(n)); }},
            {"headers", [&] { return database_.SetImmediateHeaderWrite(n != 0); }},
            {"open", [&] { return database_.Open(path_.c_str()); }},
            {"sync", [&] { return database_.Sync(); }},
            {"compress", [&] { return database_.Compress(0); }},
            {"load", [&] { return database_.Load(text_.c_str(), text); }}, // separated by these
            {"export", [&] { return database_.Export(text_.c_str(), n != 0, separator.c_str()); }}};
        const long result = operations.at(operation)();
        const int code = Code(result);
        return code != 0 ? code : result;
    }
    void Play(const std::string& script) {
        for (const auto& [step, outcome] : Cases(script))
            EXPECT_EQ(std::to_string(Run(step)), outcome) << step;
    }
    // A field as text.
    std::string FieldOf(const void* data, std::size_t column) const {
        std::string text;
        database_.FormatRecordData(&text, data, "\n");
        std::istringstream fields(text);
        for (std::size_t i = 0; i <= column; ++i)
            std::getline(fields, text);
        return text;
    }
    // The numbers of the result set's records in the order of the walk.
    std::vector<long> Walked() {
        std::vector<long> numbers;
        long number = -1;
        for (void* data = database_.QueryGetFirst(&number); data; data = database_.QueryGetNext(&number))
            numbers.push_back(number);
        return numbers;
    }

    const ROW newRow_ = Row("new", 1, 9, 1);
    TemporaryFolder folder_, texts_; // what is loaded and exported lies elsewhere
    std::string path_ = folder_.File("rows.db"), text_ = texts_.File("text");
    FaultyFiles files_;
    DATABASE database_{nullptr, files_};
};
