#include "util/Utf8.h"

#include <algorithm>
#include <array>

namespace {

constexpr char32_t LastCharacter = 0x10FFFF;

constexpr bool IsSurrogate(char32_t code) {
    return code >= 0xD800 && code <= 0xDFFF;
}

// Control characters, and those that turn the direction of what follows.
bool WorksTerminal(char32_t code) {
    return code < 0x20 || (code >= 0x7F && code < 0xA0) || code == 0x2028 || code == 0x2029 ||
           (code >= 0x202A && code <= 0x202E) || (code >= 0x2066 && code <= 0x2069);
}

void AppendEscapedBytes(std::string& out, std::string_view bytes) {
    constexpr char digits[] = "0123456789ABCDEF";
    constexpr std::string_view named = "\\\t\n\r";
    constexpr std::string_view names = "\\tnr";
    for (const char byte : bytes) {
        const auto value = static_cast<unsigned char>(byte);
        if (const std::size_t name = named.find(byte); name != named.npos)
            out += {'\\', names[name]};
        else
            out += {'\\', 'x', digits[value >> 4U], digits[value & 0x0FU]};
    }
}

struct Range {
    char32_t first;
    char32_t last;
};

constexpr Range Combining[] = {
    {0x300, 0x36F}, {0x200B, 0x200F}, {0x20D0, 0x20FF}, {0xFE00, 0xFE0F}, {0xFE20, 0xFE2F}};
constexpr Range Wide[] = {{0x1100, 0x115F},   {0x2E80, 0x303E},   {0x3041, 0xA4CF},  {0xAC00, 0xD7A3},
                          {0xF900, 0xFAFF},   {0xFE30, 0xFE6F},   {0xFF00, 0xFF60},  {0xFFE0, 0xFFE6},
                          {0x1F300, 0x1F64F}, {0x1F900, 0x1F9FF}, {0x20000, 0x3FFFD}};

template <std::size_t Count>
bool IsIn(const Range (&ranges)[Count], char32_t code) {
    return std::any_of(
        std::begin(ranges), std::end(ranges),
        [code](const Range& range) { return code >= range.first && code <= range.last; });
}

bool IsPlain(char c) {
    return c >= ' ' && c <= '~' && c != '\\';
}

} // namespace

Utf8Character DecodeFirst(std::string_view text) {
    const auto byte = [text](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    if (byte(0) < 0x80U)
        return {byte(0), 1};
    const std::size_t length = byte(0) >= 0xF0U ? 4 : byte(0) >= 0xE0U ? 3 : 2;
    if (byte(0) < 0xC2U || byte(0) > 0xF4U || text.size() < length)
        return {};
    char32_t code = byte(0) & (0xFFU >> (length + 1));
    for (std::size_t i = 1; i < length; ++i) {
        if (!IsContinuation(text[i]))
            return {};
        code = code << 6U | (byte(i) & 0x3FU);
    }
    constexpr std::array<char32_t, 5> least = {0, 0, 0x80, 0x800, 0x10000};
    return code < least[length] || code > LastCharacter || IsSurrogate(code) ? Utf8Character{}
                                                                             : Utf8Character{code, length};
}

bool IsUtf8(std::string_view text) {
    while (!text.empty()) {
        const std::size_t length = DecodeFirst(text).length;
        if (length == 0)
            return false;
        text.remove_prefix(length);
    }
    return true;
}

void AppendEscaped(std::string& out, std::string_view text, Letters letters) {
    while (!text.empty()) {
        const auto plain =
            static_cast<std::size_t>(std::find_if_not(text.begin(), text.end(), IsPlain) - text.begin());
        out += text.substr(0, plain);
        text.remove_prefix(plain);
        if (text.empty())
            return;
        const Utf8Character character = DecodeFirst(text);
        const std::size_t length = std::max<std::size_t>(character.length, 1);
        if (character.length == 0 || character.code == '\\' || WorksTerminal(character.code) ||
            (letters == Letters::Ascii && character.length > 1))
            AppendEscapedBytes(out, text.substr(0, length));
        else
            out += text.substr(0, length);
        text.remove_prefix(length);
    }
}

std::size_t DisplayWidth(std::string_view text) {
    std::size_t width = 0;
    while (!text.empty()) {
        const Utf8Character character = DecodeFirst(text);
        if (!IsIn(Combining, character.code))
            width += IsIn(Wide, character.code) ? 2 : 1;
        text.remove_prefix(std::max<std::size_t>(character.length, 1));
    }
    return width;
}

std::string TruncatedLabel(std::string_view text, float width,
                           const std::function<float(const std::string&)>& measure) {
    std::string shown(text);
    while (!text.empty() && measure(shown) > width) {
        std::size_t cut = text.size() - 1;
        while (cut > 0 && IsContinuation(text[cut]))
            --cut;
        text = text.substr(0, cut);
        shown = std::string(text) + "...";
    }
    return shown;
}
