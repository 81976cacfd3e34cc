#include "util/Numbers.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>
#include <string_view>

#include "util/CharacterBuffer.h"

namespace {

// A double's largest whole part, a sign, a point, and more decimals than anything here asks for.
constexpr std::size_t FixedTextSize = std::numeric_limits<double>::max_exponent10 + 1 + 2 + 64;

// The texts that FormatNumber groups.
constexpr std::size_t WorkTextLength = 31;

std::string_view FixedText(double value, int decimals, char (&buffer)[FixedTextSize],
                           std::chars_format form = std::chars_format::fixed) {
    if (std::isnan(value))
        return "nan";
    const int digits = decimals < 0 ? 6 : std::min(decimals, 60);
    const auto result = std::to_chars(buffer, buffer + FixedTextSize, value, form, digits);
    return {buffer, static_cast<std::size_t>(result.ptr - buffer)};
}

// How many of the `whole` characters before the point stand before the first separator; 0 for no separators.
std::size_t FirstGroup(std::size_t whole) {
    if (whole >= 10)
        return whole - 9;
    if (whole >= 7)
        return whole - 6;
    return whole >= 5 ? whole - 3 : 0;
}

} // namespace

bool FormatFixed(double value, char* out, std::size_t size, int decimals) {
    char buffer[FixedTextSize];
    return CopyText(out, size, FixedText(value, decimals, buffer));
}

void FormatNumber(float value, char* out, int decimals) {
    char buffer[FixedTextSize];
    std::string_view text = FixedText(static_cast<double>(value), decimals, buffer);
    if (text.size() > WorkTextLength) {
        text = FixedText(static_cast<double>(value), std::min(decimals, 20), buffer,
                         std::chars_format::scientific);
        CopyText(out, FormatNumberSize, text);
        return;
    }
    std::size_t whole = std::min(text.find('.'), text.size());
    const std::size_t first = FirstGroup(whole);
    char* end = out;
    const auto move = [&](std::size_t count) {
        end = std::copy_n(text.begin(), count, end);
        text.remove_prefix(count);
        whole -= std::min(count, whole);
    };
    if (first > 0) {
        const bool signAlone = first == 1 && text.front() == '-';
        move(first);
        if (!signAlone)
            *end++ = ',';
        while (whole > 3) {
            move(3);
            *end++ = ',';
        }
    }
    move(text.size());
    *end = '\0';
}

bool ReadDecimal(const char* text, double* value, const char** rest) {
    *value = 0;
    if (rest)
        *rest = text;
    text += std::strspn(text, " \t\n\v\f\r");
    const bool negative = *text == '-';
    if (*text == '-' || *text == '+')
        ++text;
    // The reader below would take a second sign, "inf" and "nan" as well.
    if (*text == '\0' || std::strchr("0123456789.", *text) == nullptr)
        return true;
    double magnitude = 0;
    const auto [end, error] = std::from_chars(text, text + std::strlen(text), magnitude);
    if (rest && end != text)
        *rest = end;
    if (error == std::errc::result_out_of_range) {
        // Too small or too large: the reader does not say which.
        const std::string_view number(text, static_cast<std::size_t>(end - text));
        const std::size_t exponent = number.find_first_of("eE");
        return exponent == number.npos ? number.front() == '.' || number.front() == '0'
                                       : number[exponent + 1] == '-';
    }
    *value = negative ? -magnitude : magnitude;
    return true;
}
