#include "dialogs/InvestmentInput.h"

#include <cmath>
#include <cstring>
#include <limits>

#include "db/DatesTimes.h"
#include "util/CharacterBuffer.h"
#include "util/Numbers.h"
#include "util/Strings.h"

namespace {

std::string ShownAmount(float amount, int decimals) {
    char text[MaxAmountBytes + 1] = "";
    if (amount > 0)
        FormatFixed(static_cast<double>(amount), text, sizeof text, decimals);
    return text;
}

// `shown` is the text for the amount as it is.
InvestmentCheck ReadAmount(const std::string& text, const std::string& shown, float* amount,
                           InvestmentCheck notPlain, InvestmentCheck tooLarge) {
    // An amount below 0 is shown as no text.
    if (text == shown && (!text.empty() || *amount < 0))
        return InvestmentCheck::Accepted;
    double number = 0;
    const char* rest = nullptr;
    const bool inRange = ReadDecimal(text.c_str(), &number, &rest);
    const bool anyNumber = text.find_first_of("0123456789") != std::string::npos;
    if (anyNumber && (rest == text.c_str() || rest[std::strspn(rest, " \t")] != '\0'))
        return notPlain;
    // In a record's single precision it would be stored as infinite.
    if (!inRange || std::fabs(number) > std::numeric_limits<float>::max())
        return tooLarge;
    *amount = static_cast<float>(number);
    return InvestmentCheck::Accepted;
}

} // namespace

std::string ShownShares(const INVESTMENT_DATA& record) {
    return ShownAmount(record.Shares, 3);
}

std::string ShownPrice(const INVESTMENT_DATA& record) {
    return ShownAmount(record.Price, 2);
}

InvestmentCheck FillInvestment(const InvestmentInput& input, INVESTMENT_DATA* record) {
    if (IsBlank(input.name))
        return InvestmentCheck::NoName;
    float shares = record->Shares;
    float price = record->Price;
    for (const InvestmentCheck check :
         {ReadAmount(input.shares, ShownShares(*record), &shares, InvestmentCheck::SharesNotPlain,
                     InvestmentCheck::SharesTooLarge),
          ReadAmount(input.price, ShownPrice(*record), &price, InvestmentCheck::PriceNotPlain,
                     InvestmentCheck::PriceTooLarge)})
        if (check != InvestmentCheck::Accepted)
            return check;
    if (!std::isfinite(shares * price))
        return InvestmentCheck::ValueTooLarge;
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
