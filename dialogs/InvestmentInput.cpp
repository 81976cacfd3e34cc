#include "dialogs/InvestmentInput.h"

#include <cmath>
#include <cstring>
#include <limits>

#include "util/CharacterBuffer.h"
#include "util/Dates.h"
#include "util/Numbers.h"

namespace {

InvestmentCheck ReadAmount(const std::string& text, float* amount) {
    double number = 0;
    const char* rest = nullptr;
    const bool inRange = ReadDecimal(text.c_str(), &number, &rest);
    if (rest != text.c_str() && rest[std::strspn(rest, " \t")] != '\0')
        return InvestmentCheck::NotPlain;
    // In a record's single precision it would be stored as infinite.
    if (!inRange || std::fabs(number) > std::numeric_limits<float>::max())
        return InvestmentCheck::TooLarge;
    *amount = static_cast<float>(number);
    return InvestmentCheck::Accepted;
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
    for (const InvestmentCheck check : {ReadAmount(input.shares, &shares), ReadAmount(input.price, &price)}) {
        if (check != InvestmentCheck::Accepted)
            return check;
    }
    if (!std::isfinite(shares * price))
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
