#pragma once

#include <cstring>
#include <string>

#include "FuzzFiles.h"
#include "db/Database.h"

// A small data file with a column of every type, a deleted and a locked record, to try statements on.

inline constexpr int SampleRecords = 12;
inline constexpr int SampleRecordSize = 12 + 1 + 2 + 4 + 4 + 4 + 3; // its data

// Makes the file at `path`, without records.
inline void CreateSample(DATABASE& database, const std::string& path) {
    struct {
        const char* name;
        std::int8_t type;
        std::int16_t size;
    } const wanted[] = {{"Name", ColumnType::String, 12}, {"Tag", ColumnType::Byte, -1},
                        {"Small", ColumnType::Short, -1}, {"Count", ColumnType::Long, -1},
                        {"Price", ColumnType::Float, 4},  {"Day", ColumnType::Date, -1},
                        {"At", ColumnType::Time, -1}};
    COLUMN_ENTRY columns[std::size(wanted)]{};
    for (std::size_t i = 0; i < std::size(wanted); ++i) {
        std::strcpy(columns[i].name, wanted[i].name);
        columns[i].type = wanted[i].type;
        columns[i].size = wanted[i].size;
    }
    std::filesystem::remove(path);
    Require(database.Create(path.c_str(), "sample", static_cast<int>(std::size(columns)), columns) == 0,
            "no sample file");
}

// The bytes of the file with its records.
inline std::string MakeSample(const std::string& path) {
    DATABASE database(nullptr);
    CreateSample(database, path);
    for (int i = 0; i < SampleRecords; ++i) {
        std::string data(SampleRecordSize, '\0');
        const std::string name = (i % 2 == 0 ? "Fund " : "\xC3\xA4pfel ") + std::to_string(i);
        data.replace(0, name.size(), name);
        for (std::size_t at = 12; at < data.size(); ++at)
            data[at] = static_cast<char>(at * static_cast<std::size_t>(i * i + 1));
        Require(database.Append(data.data()) == i, "no sample record");
    }
    Require(database.Delete(3) == 0 && database.Lock(5) == 0, "no sample marks");
    return ReadBytes(path);
}
