#pragma once

#include <string>

#include "app/model/RecordLayouts.h"
#include "util/Numbers.h"

// How an investment's figures are written in a row of the list and in a report, and how its price moved. Pure
// functions of the record.

// Holds the longest text of any figure: a cut one would be another number.
using FigureText = char[FormatNumberSize];

// With three decimals.
void FormatShares(float shares, FigureText& out);

// A stock's price in fractions down to a thirty-second ("12 3/8", "12"), any other with two decimals. A type
// is a stock's when it contains "stock" in any letter case.
void FormatPrice(float price, const char* type, FigureText& out);

// With two decimals and thousands separators.
void FormatValue(float value, FigureText& out);

// "Total Value: $1,234.50"; in words for a sum that is no number or beyond all of them.
[[nodiscard]] std::string TotalValueText(float total);

// Month, day and year: "12-25-1999".
void FormatDay(const dbDATE& date, FigureText& out);

// What the last price update did to an investment.
enum class PriceMove : std::uint8_t {
    NotFound, // it found no price
    Unknown,  // there is no earlier price to compare with
    Up,
    Down,
    Same,
};
[[nodiscard]] PriceMove MoveOf(const INVESTMENT_DATA& record);
