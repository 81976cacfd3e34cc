#pragma once

#include <array>
#include <string>

#include "ColumnListView/CLVListItem.h"
#include "app/model/InvestmentTexts.h"
#include "app/model/RecordLayouts.h"

// The columns of the investment list, in the order in which they are added.
enum class InvestmentColumn : int32 {
    Status,
    Name,
    Ticker,
    Type,
    Shares,
    Price,
    Value,
    Date,
    Retire,
    Risk,
    Agent
};
inline constexpr int32 InvestmentColumnCount = 11;

// A row of the investment list: one investment as it was when the row was made, with a picture of how its
// price moved and ten texts. It shows nothing newer: after a change of the record a new row takes its place.
// It reads no file and knows no window; the record's number is for others to go by.
//
// Who takes a row out of the list deletes it. Interface thread.
class NorvelItem : public CLVListItem {
  public:
    NorvelItem(const INVESTMENT_DATA& record, int32 recordNumber);

    // The number of the investment's record in invest.db.
    [[nodiscard]] int32 RecordNumber() const { return recordNumber_; }
    [[nodiscard]] PriceMove Movement() const { return movement_; }
    // The text of a column other than Status; empty for any number that is no such column's. Valid as long as
    // the row.
    [[nodiscard]] const char* Text(int32 column) const;

    void DrawItemColumn(BView* owner, BRect columnRect, int32 column, bool complete) override;
    void Update(BView* owner, const BFont* font) override;
    // Every column's title, in a list, and its text, in the order of the columns, and what the picture tells.
    [[nodiscard]] std::string AccessibleText() const override;
    // The name.
    [[nodiscard]] std::string SearchText() const override;

    // Orders two rows of the list by the text of a column, ASCII letters in either case being equal and all
    // else byte by byte: below 0 when a comes first.
    [[nodiscard]] static int MyCompare(const CLVListItem* a, const CLVListItem* b, int32 column);

  private:
    void DrawStatus(BView* owner, BRect columnRect) const;

    int32 recordNumber_;
    PriceMove movement_;
    float textOffset_ = 0;                                 // from a column's top to the baseline
    std::array<std::string, InvestmentColumnCount> texts_; // by column
};
