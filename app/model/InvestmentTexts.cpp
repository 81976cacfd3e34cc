#include "app/model/InvestmentTexts.h"

#include <cmath>
#include <cstring>

#include "util/CharacterBuffer.h"
#include "util/Numbers.h"
#include "util/Strings.h"

namespace {

constexpr int Parts = 32; // a stock's price is shown in thirty-seconds

bool IsStock(const char* type) {
    return Lowered(type).find("stock") != std::string::npos;
}

} // namespace

void FormatShares(float shares, FigureText& out) {
    FormatFixed(static_cast<double>(shares), out, sizeof out, 3);
}

void FormatPrice(float price, const char* type, FigureText& out) {
    if (!IsStock(type)) {
        FormatFixed(static_cast<double>(price), out, sizeof out, 2);
        return;
    }
    const double fraction = std::fmod(static_cast<double>(price), 1.0);
    // Below one part: also negative prices, and what is no number.
    if (!(fraction * Parts >= 1)) {
        FormatFixed(static_cast<double>(price), out, sizeof out, 0);
        return;
    }
    int numerator = static_cast<int>(fraction * Parts);
    int denominator = Parts;
    while (numerator % 2 == 0) {
        numerator /= 2;
        denominator /= 2;
    }
    const auto whole = static_cast<float>(static_cast<double>(price) - fraction);
    FigureText wholeText;
    FormatFixed(static_cast<double>(whole), wholeText, sizeof wholeText, 0);
    FormatInto(out, sizeof out, "%s %d/%d", wholeText, numerator, denominator);
}

void FormatValue(float value, FigureText& out) {
    FormatNumber(value, out, 2);
}

std::string TotalValueText(float total) {
    const std::string title = "Total Value: ";
    if (std::isnan(total))
        return title + "not a number";
    if (std::isinf(total))
        return title + "too large for a number";
    FigureText number;
    FormatValue(total, number);
    return title + "$" + number;
}

void FormatDay(const dbDATE& date, FigureText& out) {
    FormatInto(out, sizeof out, "%.2d-%.2d-%.4d", date.month, date.day, date.year);
}

PriceMove MoveOf(const INVESTMENT_DATA& record) {
    if (record.QuoteError != 0)
        return PriceMove::NotFound;
    if (!(record.PrevPrice > 0))
        return PriceMove::Unknown;
    if (record.Price > record.PrevPrice)
        return PriceMove::Up;
    return record.Price < record.PrevPrice ? PriceMove::Down : PriceMove::Same;
}
