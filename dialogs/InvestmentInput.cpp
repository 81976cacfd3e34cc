#include "dialogs/InvestmentInput.h"

#include <cmath>
#include <limits>

#include "util/CharacterBuffer.h"
#include "util/Dates.h"
#include "util/Numbers.h"

namespace {

// False when the number is beyond a record's single precision, where it would be stored as infinite.
bool ReadAmount(const std::string& text, float* amount) {
    double number = 0;
    if (!ReadDecimal(text.c_str(), &number) || std::fabs(number) > std::numeric_limits<float>::max())
        return false;
    *amount = static_cast<float>(number);
    return true;
}

dbDATE Today() {
    int year = 0;
    int month = 0;
    int day = 0;
    GetDate(&year, &month, &day);
    dbDATE date{};
    date.day = static_cast<std::int8_t>(day);
    date.month = static_cast<std::int8_t>(month);
    date.year = static_cast<std::int16_t>(year);
    return date;
}

} // namespace

InvestmentCheck FillInvestment(const InvestmentInput& input, INVESTMENT_DATA* record) {
    if (input.name.empty())
        return InvestmentCheck::NoName;
    float shares = 0;
    float price = 0;
    if (!ReadAmount(input.shares, &shares) || !ReadAmount(input.price, &price) ||
        !std::isfinite(shares * price))
        return InvestmentCheck::TooLarge;
    CopyTextZeroed(record->Name, input.name);
    CopyTextZeroed(record->Ticker, input.ticker);
    CopyTextZeroed(record->Type, input.type);
    CopyTextZeroed(record->Agent, input.agent);
    if (!input.risk.empty())
        CopyTextZeroed(record->Risk, input.risk);
    record->Shares = shares;
    record->Price = price;
    record->Value = shares * price;
    record->Date = Today();
    record->Retire = input.retirement ? 1 : 0;
    return InvestmentCheck::Accepted;
}
