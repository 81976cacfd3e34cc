#pragma once

#include <string>

#include "app/RecordLayouts.h"

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
    NoName,
    NotPlain, // shares or price begins with a number and goes on: "44,50" or "12 3/8" must not become 44 or
              // 12
    TooLarge, // shares, price or their product is beyond what a record can hold
};

// Puts the input into the record: texts cut to their fields, shares and price read as decimal numbers (0 when
// the text begins with none), Value as their product in single precision, today's date. Portfolio, PrevPrice
// and QuoteError are left alone, and so is Risk when none was chosen. The record is only changed when the
// answer is Accepted.
[[nodiscard]] InvestmentCheck FillInvestment(const InvestmentInput& input, INVESTMENT_DATA* record);
