#include "quotes/Fraction.h"

#include <charconv>
#include <limits>
#include <optional>
#include <string_view>

#include "quotes/Tokens.h"
#include "util/Strings.h"

namespace {

constexpr double Malformed = -1;

// The integer at the start of the token, 0 when there is none.
int LeadingInteger(std::string_view token) {
    token.remove_prefix(std::min(token.find_first_not_of(" \t\n\v\f\r"), token.size()));
    const bool signedPlus = !token.empty() && token.front() == '+';
    if (signedPlus)
        token.remove_prefix(1);
    if (signedPlus && !token.empty() && token.front() == '-')
        return 0;
    int value = 0;
    const auto [end, error] = std::from_chars(token.data(), token.data() + token.size(), value);
    if (error == std::errc::result_out_of_range)
        return token.front() == '-' ? std::numeric_limits<int>::min() : std::numeric_limits<int>::max();
    return value;
}

double Quotient(std::string_view numerator, int denominator) {
    return static_cast<double>(LeadingInteger(numerator)) / denominator;
}

// The token inside the mark-up that `mark` opens: the next one behind the first ">" after it. Moves `text` to
// behind that token.
std::optional<std::string_view> MarkedToken(std::string_view& text, std::string_view mark) {
    const std::size_t start = text.find(mark);
    const std::size_t bracket = start == text.npos ? text.npos : text.find('>', start);
    if (bracket == text.npos)
        return std::nullopt;
    text.remove_prefix(bracket + 1);
    return TakeToken(text, " <");
}

double MarkedFraction(std::string_view text) {
    const auto numerator = MarkedToken(text, "sup");
    const auto denominator = numerator ? MarkedToken(text, "sub") : std::nullopt;
    const int divisor = denominator ? LeadingInteger(*denominator) : 0;
    return divisor == 0 ? Malformed : Quotient(*numerator, divisor);
}

double PlainFraction(std::string_view text) {
    const auto numerator = TakeToken(text, " /");
    const auto denominator = numerator ? TakeToken(text, " <>") : std::nullopt;
    const int divisor = denominator ? LeadingInteger(*denominator) : 0;
    return divisor == 0 ? 0 : Quotient(*numerator, divisor);
}

} // namespace

double LookForFraction(char* text) {
    strlwr(text);
    const std::string_view lowered(text);
    return lowered.find("sup") != lowered.npos ? MarkedFraction(lowered) : PlainFraction(lowered);
}
