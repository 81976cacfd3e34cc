#pragma once

#include <cstdint>

// The plain values of the record database: what a data file's header and column table hold, and the two value
// types that date and time columns hold. Their bytes on disk are described in doc/data-file.md.

// Type codes of a column, as stored in a data file.
namespace ColumnType {
inline constexpr std::int8_t String =
    0;                                 // NUL-terminated text; the width is chosen by whoever creates the file
inline constexpr std::int8_t Byte = 1; // signed 8-bit integer
inline constexpr std::int8_t Short = 2; // signed 16-bit integer
inline constexpr std::int8_t Long = 3;  // signed 32-bit integer
inline constexpr std::int8_t Float = 4; // IEEE single precision in the first 4 bytes of the column
inline constexpr std::int8_t Date = 5;  // dbDATE
inline constexpr std::int8_t Time = 6;  // dbTIME
} // namespace ColumnType

// The bits of COLUMN_ENTRY::format that hold a float column's decimals.
inline constexpr std::int32_t DecimalsMask = 15;

inline constexpr int NameSize = 32; // bytes of a column name or description, the terminator included

// The first 52 bytes of a data file.
struct DATABASE_HEADER {
    float version;              // 1.0
    char description[NameSize]; // free text, at most 31 characters
    std::int32_t recordCount;   // record slots in the file, deleted records included
    std::int32_t deletedCount;  // records that are marked as deleted
    std::int16_t columnCount;   // entries of the column table
    std::int16_t recordLength;  // bytes of one record: its status byte and its data
    std::int32_t reserved;      // 0, save while AppendAll runs: the records it adds
};
static_assert(sizeof(DATABASE_HEADER) == 52);

// One entry of the column table, 44 bytes.
struct COLUMN_ENTRY {
    char name[NameSize]; // matched exactly, at most 31 characters
    std::int8_t type;    // one of ColumnType
    std::int16_t size;   // bytes of the column in a record; negative in a request: the type's own width
    std::int16_t offset; // where the column begins in a record's data (the status byte not counted)
    std::int32_t format; // float columns: decimals of the text form in DecimalsMask; else 0
};
static_assert(sizeof(COLUMN_ENTRY) == 44);

// A date. Read as a little-endian 32-bit number (its packed form), later dates are larger numbers.
struct dbDATE {
    std::int8_t day;   // 1 to the month's length
    std::int8_t month; // 1 to 12
    std::int16_t year; // with the century
};
static_assert(sizeof(dbDATE) == 4);

// A time of day. Read as a little-endian 24-bit number (its packed form), later times are larger numbers.
struct dbTIME {
    std::int8_t second; // 0 to 59
    std::int8_t minute; // 0 to 59
    std::int8_t hour;   // 0 to 23
};
static_assert(sizeof(dbTIME) == 3);
