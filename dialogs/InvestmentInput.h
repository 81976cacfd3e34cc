#pragma once

#include <string>

#include "app/model/RecordLayouts.h"

// What a person typed and chose in the investment form, as it stands in its fields (UTF-8).
struct InvestmentInput {
    std::string name;
    std::string ticker;
    std::string type;
    std::string shares;
    std::string price;
    std::string risk; // empty: none chosen
    std::string agent;
    bool retirement = false;
};

enum class InvestmentCheck {
    Accepted,
    NoName, // empty, or nothing but blanks
    // There are digits, and more than a number: "44,50", "12 3/8" or "$5" must not become 44, 12 or 0.
    SharesNotPlain,
    PriceNotPlain,
    // Beyond what a record can hold.
    SharesTooLarge,
    PriceTooLarge,
    ValueTooLarge,
};

// What the form's fields can hold for shares and price: more than the longest amount of a record is shown
// with.
inline constexpr int MaxAmountBytes = 47;

// A record's shares and price as the form shows them, with three and two decimals; empty unless above 0.
[[nodiscard]] std::string ShownShares(const INVESTMENT_DATA& record);
[[nodiscard]] std::string ShownPrice(const INVESTMENT_DATA& record);

// Puts the input into the record: texts cut to their fields, shares and price read as decimal numbers (0 when
// the text has none), Value as their product in single precision, today's date. Shares and price that read as
// the record's own are shown keep all their decimals. Portfolio, PrevPrice and QuoteError are left alone, and
// so is Risk when none was chosen. The record is only changed when the answer is Accepted.
[[nodiscard]] InvestmentCheck FillInvestment(const InvestmentInput& input, INVESTMENT_DATA* record);
