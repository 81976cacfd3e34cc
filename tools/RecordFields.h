#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "db/RecordTypes.h"
#include "tools/TableWriter.h"

// The fields of records as text: what `quorvan-cli db` shows, and what it takes on its command line. Dates
// are YYYYMMDD, times HHMMSS.

// The name of a column type ("string", "byte", ...); "unknown" for a code that is none.
[[nodiscard]] const char* ColumnTypeName(std::int8_t type);

// Makes `cell` the value of the column in a record's data. A column of unknown type has none.
void FillCell(const COLUMN_ENTRY& column, const std::uint8_t* data, Cell* cell);

// Writes a value into the column of a record's data, which must be zeroed. Refused are a text that is too
// long or has a byte 0 in it, a number that is none or beyond the column's range, an infinite float, and a
// date or time that does not exist; an empty date or 00000000 is none. Returns an empty text on success, else
// what is wrong with the value.
[[nodiscard]] std::string StoreField(const COLUMN_ENTRY& column, std::string_view text, std::uint8_t* data);

// Reads a column's description: NAME:TYPE[:WIDTH[:DECIMALS]]. A string needs its width in bytes, its end
// included; the other types have one of their own. Returns an empty text on success, else what is wrong.
[[nodiscard]] std::string ParseColumn(std::string_view text, COLUMN_ENTRY* column);
