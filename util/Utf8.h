#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <string_view>

// Text of any bytes taken for UTF-8, and how it is shown in one line of a terminal or of a tab-separated
// file.

// Whether the byte goes on a character that began before it.
[[nodiscard]] constexpr bool IsContinuation(char byte) {
    return (static_cast<unsigned char>(byte) & 0xC0U) == 0x80U;
}

struct Utf8Character {
    char32_t code = 0;
    std::size_t length = 0; // in bytes; 0 when the bytes begin no valid character
};

// The character at the beginning of a text that is not empty.
[[nodiscard]] Utf8Character DecodeFirst(std::string_view text);

// Whether all of `text` is valid UTF-8.
[[nodiscard]] bool IsUtf8(std::string_view text);

// Appends `text` to `out`: a backslash as "\\", tab, newline and carriage return as "\t", "\n" and "\r", and
// every other byte that is no printable character of valid UTF-8 as "\x" and two hexadecimal digits. So what
// is appended is valid UTF-8 on one line, works no terminal, and can be turned back into the bytes. With
// Letters::Ascii all bytes beyond that are written so.
enum class Letters { Utf8, Ascii };
void AppendEscaped(std::string& out, std::string_view text, Letters letters = Letters::Utf8);

// How many cells of a terminal a text of AppendEscaped takes: none for a combining mark, two for a wide
// character.
[[nodiscard]] std::size_t DisplayWidth(std::string_view text);

// The text itself when it fits into width, else its longest beginning of whole UTF-8 characters that fits
// with three dots behind it; the dots alone when nothing else fits. measure gives a text's width.
[[nodiscard]] std::string TruncatedLabel(std::string_view text, float width,
                                         const std::function<float(const std::string&)>& measure);
