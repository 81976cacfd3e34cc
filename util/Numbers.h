#pragma once

#include <cstddef>

// Numbers as text and back, in the same form whatever the process's locale is.

// What FormatNumber writes at most, its NUL included.
inline constexpr std::size_t FormatNumberSize = 48;

// Fixed-point text with exactly `decimals` digits after the point, correctly rounded, as "%.*f" writes it in
// the C locale; text that does not fit the `size` bytes at `out` is cut. True when it fitted. `decimals`
// below 0 means 6.
bool FormatFixed(double value, char* out, std::size_t size, int decimals);

// Fixed-point text with thousands separators, into the FormatNumberSize bytes at `out`: 1234567 with 2
// decimals gives "1,234,567.00". Four characters before the point get no separator ("1234.50"), a minus sign
// counts as one of them
// ("-1,234.00"), and beyond thirteen digits the first group is the longer one ("1234,567,890,123.00").
// A value whose plain text is longer than 31 characters is written with an exponent instead ("1.00e+30");
// infinities and NaN as "inf", "-inf" and "nan".
void FormatNumber(float value, char* out, int decimals);

// Reads the decimal number at the start of `text`: leading white space, a sign, digits with an optional point
// and exponent; what follows it is ignored. Stores 0 when there is none (so for "inf" and "nan") and when it
// is too small for a double. False, with 0 stored, when it is beyond a double's range. `rest`, unless null,
// is set to what follows the number, or to `text` when there is none.
[[nodiscard]] bool ReadDecimal(const char* text, double* value, const char** rest = nullptr);
