#pragma once

#include "app/model/RecordLayouts.h"

// What an answer to the question for an investment's price leads to.
enum class QuoteOutcome {
    Priced,  // the record has a new price
    NoPrice, // nobody knows a price; the record is marked so
    Failed   // the question could not be asked; the record is as it was
};

// Brings the record up to date with what GetPriceQuote answered; writes nothing to a file.
//
// A price becomes the record's Price, the former one its PrevPrice; Value is the price times Shares in single
// precision, Date is today, and QuoteError is cleared. A price that is no price of this world (it or the
// value is beyond a float) counts as none. Without a price QuoteError is set and all else stays.
[[nodiscard]] QuoteOutcome ApplyQuote(INVESTMENT_DATA& record, float quote);
