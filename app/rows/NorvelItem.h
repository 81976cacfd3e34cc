#pragma once

#include <array>
#include <memory>

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
    [[nodiscard]] static std::unique_ptr<NorvelItem> Make(const INVESTMENT_DATA& record, int32 recordNumber);

    // The number of the investment's record in invest.db.
    [[nodiscard]] int32 RecordNumber() const { return recordNumber_; }
    [[nodiscard]] PriceMove Movement() const { return movement_; }
    // The text of a column other than Status; empty for any number that is no such column's. Valid as long as
    // the row.
    [[nodiscard]] const char* Text(int32 column) const;

    void DrawItemColumn(BView* owner, BRect columnRect, int32 column, bool complete) override;
    void Update(BView* owner, const BFont* font) override;
    // Every column's text in the order of the columns, and what the picture tells in words.
    [[nodiscard]] std::string AccessibleText() const override;
    // The name.
    [[nodiscard]] std::string SearchText() const override;

    // Orders two rows of the list by the text of a column, ASCII letters in either case being equal and all
    // else byte by byte: below 0 when a comes first.
    [[nodiscard]] static int MyCompare(const CLVListItem* a, const CLVListItem* b, int32 column);

    // A row and its texts are one block of memory: a large portfolio has a hundred thousand of them.
    static void operator delete(void* row) { ::operator delete(row); }

  private:
    // The fields of a record that are shown as they are stored, one behind the other at the row's end.
    enum Field { Name, Ticker, Type, Agent, Risk, FieldCount };
    struct Fields;
    // The texts of the columns from Shares to Date, each null until it is asked for. Formatting every figure
    // of every row would take longer than reading the file, and most rows are never seen.
    using Figures = std::array<std::unique_ptr<char[]>, 4>;

    struct TextBytes {
        std::size_t count;
    };
    static void* operator new(std::size_t size, TextBytes texts) {
        return ::operator new(size + texts.count);
    }
    static void operator delete(void* row, TextBytes) { ::operator delete(row); }

    NorvelItem(const INVESTMENT_DATA& record, int32 recordNumber, const Fields& fields);
    [[nodiscard]] const char* FieldText(Field field) const {
        return reinterpret_cast<const char*>(this + 1) + begins_[field];
    }
    [[nodiscard]] const char* FigureOf(InvestmentColumn column) const;
    void Format(InvestmentColumn column, FigureText& out) const;
    void DrawStatus(BView* owner, BRect columnRect) const;

    int32 recordNumber_;
    float textOffset_ = 0; // from a column's top to the baseline
    mutable std::unique_ptr<Figures> figures_;
    float shares_;
    float price_;
    float value_;
    dbDATE date_;
    PriceMove movement_;
    bool retire_;
    uint8 begins_[FieldCount]; // of the texts behind the row
};
