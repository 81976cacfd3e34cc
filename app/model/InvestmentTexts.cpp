#include "app/model/InvestmentTexts.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <string>

#include "util/CharacterBuffer.h"
#include "util/Numbers.h"
#include "util/Strings.h"

namespace {

constexpr int Parts = 32; // a stock's price is shown in thirty-seconds

bool IsStock(const char* type) {
    return Lowered(type).find("stock") != std::string::npos;
}

// As "%.*d" does, in a tenth of its time: a long list has a hundred thousand dates and prices.
char* PutNumber(char* out, int number, int digits) {
    const std::string text = std::to_string(std::abs(number));
    if (number < 0)
        *out++ = '-';
    out = std::fill_n(out, std::max(digits - static_cast<int>(text.size()), 0), '0');
    return std::copy(text.begin(), text.end(), out);
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
    FormatFixed(static_cast<double>(whole), out, sizeof out, 0);
    char* end = out + std::strlen(out);
    *end++ = ' ';
    end = PutNumber(end, numerator, 1);
    *end++ = '/';
    *PutNumber(end, denominator, 1) = '\0';
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
    char* end = PutNumber(out, date.month, 2);
    *end++ = '-';
    end = PutNumber(end, date.day, 2);
    *end++ = '-';
    *PutNumber(end, date.year, 4) = '\0';
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
