#pragma once

#include <string_view>

// Helpers for NUL-terminated byte strings, most of them in place. The case conversions know the ASCII letters
// only and stop at the first byte of value 128 or above; queries, sorts and charts all rely on this one rule.

// Replaces every `from` in `text` by `to`.
void ReplaceCharacter(char* text, char from, char to);

// Removes trailing blanks and line feeds; tabs, carriage returns and leading blanks stay.
void Trim(char* text);

// Whether there is nothing but blanks in the text, or nothing at all: a field that looks empty.
[[nodiscard]] inline bool IsBlank(std::string_view text) {
    return text.find_first_not_of(' ') == std::string_view::npos;
}

// Turns A-Z into a-z, from the start up to the end or the first byte of value 128 or above.
void strlwr(char* text);

// Turns a-z into A-Z, with the same stop.
void strupr(char* text);

// Compares as if both operands had gone through strlwr: negative, 0 or positive by the first differing byte,
// bytes taken as unsigned. Operands of any length are compared whole: two long texts that differ late are not
// equal.
[[nodiscard]] int strcmpi(const char* a, const char* b);
