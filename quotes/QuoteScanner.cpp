#include "quotes/QuoteScanner.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <optional>

#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "util/Numbers.h"
#include "util/Strings.h"

namespace {

constexpr double Malformed = -1;

// The integer at the start of the token, 0 when there is none.
int LeadingInteger(std::string_view token) {
    const long value = std::strtol(std::string(token).c_str(), nullptr, 10);
    return static_cast<int>(std::clamp<long>(value, INT_MIN, INT_MAX));
}

// `otherwise` when a number is missing, or the divisor is 0.
double Quotient(std::optional<std::string_view> numerator, std::optional<std::string_view> denominator,
                double otherwise) {
    const int divisor = numerator && denominator ? LeadingInteger(*denominator) : 0;
    return divisor == 0 ? otherwise : static_cast<double>(LeadingInteger(*numerator)) / divisor;
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
    return Quotient(numerator, MarkedToken(text, "sub"), Malformed);
}

double PlainFraction(std::string_view text) {
    const auto numerator = TakeToken(text, " /");
    return Quotient(numerator, TakeToken(text, " <>"), 0);
}

// The sum as a price; NoQuote when no float holds it.
float PriceOf(double whole, double fraction) {
    const double sum = fraction > 0 ? whole + fraction : whole;
    return std::abs(sum) <= static_cast<double>(std::numeric_limits<float>::max()) ? static_cast<float>(sum)
                                                                                   : NoQuote;
}

} // namespace

double LookForFraction(char* text) {
    strlwr(text);
    const std::string_view lowered(text);
    return lowered.find("sup") != lowered.npos ? MarkedFraction(lowered) : PlainFraction(lowered);
}

QuoteScanner::QuoteScanner(std::string_view tag, int skip, QuoteReport& report)
    : report_(report), tag_(tag), remaining_(skip), price_(NoQuote) {}

bool QuoteScanner::Scan(std::string_view piece) {
    std::string_view rest = piece;
    if (!FindTag(rest) || !PassBrackets(rest))
        return false;
    report_.LogText("skipped ok\n");
    const auto token = TakeToken(rest, " \t\n<>");
    if (!token) {
        report_.LogText("value string not found\n");
        return false;
    }
    ReadPrice(*token, rest);
    return true;
}

bool QuoteScanner::FindTag(std::string_view& rest) {
    if (tagFound_)
        return true;
    const std::size_t position = rest.find(tag_);
    if (position == rest.npos)
        return false;
    report_.LogText("found tag\n");
    report_.Observer().MarkerFound(rest, position);
    tagFound_ = true;
    rest.remove_prefix(position);
    return true;
}

bool QuoteScanner::PassBrackets(std::string_view& rest) {
    if (remaining_ <= 0)
        return true;
    while (remaining_ > 0 && !rest.empty()) {
        const std::size_t bracket = rest.find('>');
        if (bracket == rest.npos)
            return false;
        --remaining_;
        rest.remove_prefix(bracket + 1);
    }
    return !rest.empty();
}

void QuoteScanner::ReadPrice(std::string_view token, std::string_view following) {
    const std::string text(token.substr(0, token.find('\0')));
    report_.Log("value string is '" + text + "'\n");
    double whole = 0;
    const bool readable = ReadDecimal(text.c_str(), &whole);
    std::string rest(following);
    const double fraction = LookForFraction(rest.data());
    report_.Observer().PriceRead(token, following, whole, fraction);
    price_ = readable && fraction >= 0 ? PriceOf(whole, fraction) : NoQuote;
}
