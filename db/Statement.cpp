#include "db/Statement.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <string_view>

#include "util/CharacterBuffer.h"
#include "util/Numbers.h"
#include "util/Strings.h"

namespace {

constexpr const char* Delimiters = " \t\n\r";
constexpr const char* ValueDelimiters = "\t\n\r";

// Copies the next token off `rest`; false without one that fits.
bool TakeInto(char (&token)[TokenSize], std::string_view& rest, std::string_view delimiters) {
    const auto text = TakeToken(rest, delimiters);
    return text && CopyText(token, *text);
}

// Reads numbers of fixed widths that stand one after the other; those after the first that is missing are 0.
std::array<std::int32_t, 3> DigitGroups(const char* digits, std::array<int, 3> widths) {
    std::array<std::int32_t, 3> numbers{};
    digits += std::strspn(digits, " ");
    for (std::size_t group = 0; group < widths.size(); ++group)
        for (int i = 0; i < widths[group] && *digits >= '0' && *digits <= '9'; ++i, ++digits)
            numbers[group] = numbers[group] * 10 + (*digits - '0');
    return numbers;
}

} // namespace

bool SplitStatement(const char* statement, Statement* result) {
    if (statement == nullptr)
        return false;
    std::string_view rest(statement, strnlen(statement, LongestStatement + 1));
    return rest.size() <= LongestStatement && TakeInto(result->column, rest, Delimiters) &&
           TakeInto(result->op, rest, Delimiters) && TakeInto(result->value, rest, ValueDelimiters);
}

std::int64_t WholeNumber(const char* text) {
    return std::strtoll(text, nullptr, 10);
}

float SingleNumber(const char* text) {
    constexpr float largest = std::numeric_limits<float>::max();
    constexpr double roundsToInfinity = 0x1.ffffffp127; // half a unit beyond the largest
    constexpr float infinity = std::numeric_limits<float>::infinity();
    const std::string_view word(text);
    if (word == "nan")
        return std::numeric_limits<float>::quiet_NaN();
    double number = 0;
    if (word == "inf" || word == "-inf" || !ReadDecimal(text, &number) ||
        std::abs(number) >= roundsToInfinity)
        return word.find_first_not_of(" \t\n\v\f\r") == word.find('-') ? -infinity : infinity;
    return static_cast<float>(std::clamp<double>(number, -largest, largest));
}

std::int32_t PackedDate(const char* digits) {
    const auto [year, month, day] = DigitGroups(digits, {4, 2, 2});
    return year * 65536 + month * 256 + day;
}

std::int32_t PackedTime(const char* digits) {
    const auto [hour, minute, second] = DigitGroups(digits, {2, 2, 2});
    return hour * 65536 + minute * 256 + second;
}
