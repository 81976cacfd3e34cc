#pragma once

#include <cstddef>

#include "app/model/RecordLayouts.h"

// What stands on the printed report. Pure functions.

inline constexpr int ReportColumnCount = 7;
inline constexpr std::size_t ReportCellSize = 32;
using ReportRow = char[ReportColumnCount][ReportCellSize];

inline constexpr std::size_t ReportTextSize = 64;
using ReportText = char[ReportTextSize];

// The cells of an investment: name, ticker, shares (three decimals), price, value (two each), agent and risk.
// Text is cut to a cell's 31 bytes; a number that would be is "#####".
void FillReportRow(const INVESTMENT_DATA& record, ReportRow& row);

// The month's name, the two-digit day, the year and two spaces: "March 05, 1999  ".
void FormatReportDate(int year, int month, int day, ReportText& out);

// How many investments the portfolio has, and when the page has not room for all, how many of them it shows:
// "1 investment", "17 investments", "45 of 200 investments".
void FormatReportCount(long shown, long all, ReportText& out);
