#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

// Reads comma-separated text (RFC 4180) by libcsv, with another delimiter and other line ends too. Blanks
// around a field count only within quotation marks; blank lines and a UTF-8 byte order mark at the beginning
// are passed over.
//
// `use` is called for each row with the number of the line in which it begins, counted from 1, and its
// fields. Returns an empty text, or where and why the rest cannot be divided into rows.
using CsvRow = std::function<void(long line, const std::vector<std::string>& fields)>;
[[nodiscard]] std::string ReadCsv(std::string_view text, char delimiter, const CsvRow& use);

// A number as people and programs write it, with the decimal mark `decimal` and perhaps separators between
// groups of three digits, as the plain text of it. `decimal` is '.' or ',', or 0 for a point that was not
// asked for: then what may be a whole number in groups or a broken one, such as "1,234", is refused.
struct PlainNumber {
    std::string text; // with a point and without separators
    std::string wrong;
};
[[nodiscard]] PlainNumber ReadPlainNumber(std::string_view text, char decimal);
