#pragma once

#include <cstddef>
#include <string_view>

// Bounded text for the fixed character buffers that records, paths and settings are kept in. Every function
// here writes at most the size it is given, ends the text with a NUL, and cuts only between whole UTF-8
// characters.

// The longest beginning of `text` that is at most `maxBytes` long and does not end inside a UTF-8 character.
// Bytes that are no valid UTF-8 are cut like any other byte. The result borrows `text`.
[[nodiscard]] std::string_view CutToBytes(std::string_view text, std::size_t maxBytes);

// Copies `text` into the `size` bytes at `target`, cut where needed. Text after a NUL inside `text` is not
// copied. True when all of it fitted. A size of 0 writes nothing and is false.
bool CopyText(char* target, std::size_t size, std::string_view text);

template <std::size_t Size>
bool CopyText(char (&target)[Size], std::string_view text) {
    return CopyText(target, Size, text);
}

// As above, and fills the rest of the buffer with zeros, so that no byte of an earlier text reaches a file.
template <std::size_t Size>
bool CopyTextZeroed(char (&target)[Size], std::string_view text) {
    const bool whole = CopyText(target, Size, text);
    const std::size_t length = std::string_view(target).size();
    for (std::size_t i = length; i < Size; ++i)
        target[i] = '\0';
    return whole;
}

// Formats as printf does into the `size` bytes at `target`. True when the whole text fitted; otherwise the
// buffer holds its cut beginning. Not for floating-point conversions, which follow the process's locale: use
// FormatFixed.
bool FormatInto(char* target, std::size_t size, const char* format, ...)
    __attribute__((format(printf, 3, 4)));

// The text of a fixed field that may lack its NUL, such as one read from a file.
template <std::size_t Size>
[[nodiscard]] std::string_view FieldText(const char (&field)[Size]) {
    const std::string_view all(field, Size);
    return all.substr(0, all.find('\0'));
}
