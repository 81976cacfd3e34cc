#pragma once

#include <cstdint>

// Room for one token of a statement: 31 characters and the terminator.
inline constexpr int TokenSize = 32;
// The longest query or set statement.
inline constexpr int LongestStatement = 127;

// A query or set statement taken apart.
struct Statement {
    char column[TokenSize];
    char op[TokenSize];
    char value[TokenSize];
};

// Takes a statement apart. Column and operator end at a blank, tab, newline or carriage return. The value
// begins after the one character that ended the operator, less leading tabs, newlines and carriage returns,
// and runs to the next of these or to the end; blanks belong to it. False when a token is missing or longer
// than 31 characters or the statement longer than 127; `result` is then not to be used.
[[nodiscard]] bool SplitStatement(const char* statement, Statement* result);

// Values of statements. Text that is no number reads as 0; none of these depends on the process's locale.

// A decimal whole number, as the C library's conversions read it; out of range it stops at the 64-bit
// limits.
[[nodiscard]] std::int64_t WholeNumber(const char* text);
// A decimal number rounded to single precision; out of range it is infinite or 0. The words "inf", "-inf"
// and "nan", alone, are what an export writes for a float that is no number, and are read as that.
[[nodiscard]] float SingleNumber(const char* text);
// YYYYMMDD (up to 4, 2 and 2 digits) as a packed date; parts that are not there are 0.
[[nodiscard]] std::int32_t PackedDate(const char* digits);
// HHMMSS (up to 2, 2 and 2 digits) as a packed time; parts that are not there are 0.
[[nodiscard]] std::int32_t PackedTime(const char* digits);
