#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>

// Helpers for byte strings. The case conversions know the ASCII letters only and stop at the first byte of
// value 128 or above; queries, sorts and charts all rely on this one rule.

inline constexpr std::uint8_t FirstNonAscii = 128;

// A to Z in lower letters, every other byte as it is.
[[nodiscard]] constexpr std::uint8_t LoweredByte(std::uint8_t c) {
    return static_cast<std::uint8_t>(c + (static_cast<std::uint8_t>(c - 'A') < 26 ? 'a' - 'A' : 0));
}

// a to z in capitals, every other byte as it is.
[[nodiscard]] constexpr char Raised(char c) {
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

// Copies `size` bytes to `lowered` in lower letters, as far as letters count as such. The copy goes on behind
// a NUL.
inline void CopyLowered(const std::uint8_t* text, std::size_t size, std::uint8_t* lowered) {
    std::uint8_t seen = 0;
    for (std::size_t i = 0; i < size; ++i) { // no way out, so that many bytes are done at once
        seen |= text[i];
        lowered[i] = LoweredByte(text[i]);
    }
    if (seen >= FirstNonAscii) {
        std::size_t first = 0;
        while (text[first] < FirstNonAscii)
            ++first;
        std::memcpy(lowered + first, text + first, size - first);
    }
}

// The text in lower letters as strlwr makes them.
[[nodiscard]] std::string Lowered(std::string_view text);

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

// The next token of `text`: the longest run of bytes that are none of `delimiters`, leading delimiters passed
// over. Moves `text` to behind the one delimiter that ends the token, or to its end. Without a token there is
// none, and `text` becomes empty. Nothing is remembered between calls, so that threads never meet here.
[[nodiscard]] inline std::optional<std::string_view> TakeToken(std::string_view& text,
                                                               std::string_view delimiters) {
    const std::size_t start = text.find_first_not_of(delimiters);
    if (start == text.npos) {
        text = {};
        return std::nullopt;
    }
    const std::size_t end = std::min(text.find_first_of(delimiters, start), text.size());
    const std::string_view token = text.substr(start, end - start);
    text.remove_prefix(std::min(end + 1, text.size()));
    return token;
}

// What the system says of an errno number.
[[nodiscard]] std::string Reason(int error);

// The program's paths are kept in buffers of this size: 127 bytes and a NUL.
inline constexpr std::size_t PathBufferSize = 128;

// Splits `path` into the text before its last "/" (`dir`), the text between that and the last "." after it
// (`fname`) and the text after that "." (`ext`). Separators are not included, and a part that is not there is
// empty; so is the directory of a file in the root. `drive` is never written. Each result must hold
// PathBufferSize bytes: of a path that does not fit that size itself all three are empty.
void _splitpath(const char* path, char* drive, char* dir, char* fname, char* ext);

// Joins "dir/fname", or "dir/fname.ext" when `ext` is not empty, into the PathBufferSize bytes at `out`;
// `drive` is ignored. A path that does not fit leaves `out` empty: a cut path would name another file.
void _makepath(char* out, const char* drive, const char* dir, const char* fname, const char* ext);
