#include "quotes/QuoteScanner.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "quotes/Fraction.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/Tokens.h"
#include "util/Numbers.h"

namespace {

// The sum as a price; NoQuote when no float holds it.
float PriceOf(double whole, double fraction) {
    const double sum = fraction > 0 ? whole + fraction : whole;
    return std::abs(sum) <= static_cast<double>(std::numeric_limits<float>::max()) ? static_cast<float>(sum)
                                                                                   : NoQuote;
}

} // namespace

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
    const std::string text(token);
    report_.Log("value string is '%s'\n", text.c_str());
    double whole = 0;
    const bool readable = ReadDecimal(text.c_str(), &whole);
    std::string rest(following);
    const double fraction = LookForFraction(rest.data());
    report_.Observer().PriceRead(token, following, whole, fraction);
    price_ = readable && fraction >= 0 ? PriceOf(whole, fraction) : NoQuote;
}
