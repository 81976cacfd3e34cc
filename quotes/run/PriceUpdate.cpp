#include "quotes/run/PriceUpdate.h"

#include <cmath>

#include "db/Database.h"
#include "quotes/QuoteRetrieval.h"

QuoteOutcome ApplyQuote(INVESTMENT_DATA& record, float quote) {
    const float value = quote * record.Shares;
    const bool beyondAFloat = quote > 0 && !std::isfinite(value);
    if (quote == NoQuote || beyondAFloat) {
        record.QuoteError = 1;
        return QuoteOutcome::NoPrice;
    }
    if (!(quote > 0))
        return QuoteOutcome::Failed;
    record.PrevPrice = record.Price;
    record.Price = quote;
    record.Value = value;
    dbDATE today;
    DATABASE(nullptr).SetToCurrentDate(&today);
    record.Date = today;
    record.QuoteError = 0;
    return QuoteOutcome::Priced;
}
