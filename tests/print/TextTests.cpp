// The report's texts, without a page.
#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <string>
#include <vector>

#include "print/ReportTexts.h"

namespace {

std::vector<std::string> Cells(const INVESTMENT_DATA& record) {
    ReportRow row;
    std::memset(row, '?', sizeof row);
    FillReportRow(record, row);
    std::vector<std::string> cells;
    for (const char* cell : row)
        cells.emplace_back(cell);
    return cells;
}

TEST(ReportTexts, ARowHoldsSevenCellsOfTheRecord) {
    INVESTMENT_DATA record{};
    std::strcpy(record.Name, "Timber");
    std::strcpy(record.Ticker, "TMB");
    std::strcpy(record.Agent, "Bank");
    std::strcpy(record.Risk, "Low");
    record.Shares = 12345.5F;
    record.Price = 0.125F;
    record.Value = 1234567.5F;
    EXPECT_EQ(Cells(record), (std::vector<std::string>{"Timber", "TMB", "12,345.500", "0.12", "1,234,567.50",
                                                       "Bank", "Low"}));
    // Fields without an end, and numbers that no investment has.
    std::memset(&record, 'x', sizeof record);
    record.Shares = std::numeric_limits<float>::quiet_NaN();
    record.Price = -std::numeric_limits<float>::infinity();
    record.Value = 1e26F; // 34 characters
    const std::string full(31, 'x');
    EXPECT_EQ(Cells(record),
              (std::vector<std::string>{full, "xxxxxxxx", "nan", "-inf", "#####", full, full}));
    record.Value = 3e38F;
    EXPECT_EQ(Cells(record)[4], "3.00e+38");
}

TEST(ReportTexts, TotalDateAndCountAreWrittenOut) {
    ReportText text;
    FormatReportTotal(0, text);
    EXPECT_STREQ(text, "Total Value: $0.00");
    FormatReportTotal(-3.4e38F, text);
    EXPECT_STREQ(text, "Total Value: $-3.40e+38");
    FormatReportDate(1999, 3, 5, text);
    EXPECT_STREQ(text, "March 05, 1999  ");
    FormatReportDate(2026, 11, 16, text);
    EXPECT_STREQ(text, "November 16, 2026  ");
    const struct {
        long shown, all;
        const char* text;
    } counts[] = {{0, 0, "0 investments"},
                  {1, 1, "1 investment"},
                  {17, 17, "17 investments"},
                  {39, 200, "39 of 200 investments"}};
    for (const auto& count : counts) {
        FormatReportCount(count.shown, count.all, text);
        EXPECT_STREQ(text, count.text);
    }
}

} // namespace
