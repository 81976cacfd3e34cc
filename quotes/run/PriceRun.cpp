#include "quotes/run/PriceRun.h"

#include <cmath>

#include "app/model/PortfolioRules.h"
#include "db/Database.h"
#include "db/DatesTimes.h"
#include "quotes/QuoteRetrieval.h"
#include "util/File.h"
#include "util/Strings.h"

void LogConnection(const char* host, Connection connection, const char* logPath) {
    const char* result = connection == Connection::Found      ? "connection found ok"
                         : connection == Connection::NotFound ? "no connection found!"
                                                              : "cancelled";
    PrintDebugStatement((std::string("Checked '") + host + "', " + result + "\n").c_str(), logPath);
}

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
    record.Date = Today();
    record.QuoteError = 0;
    return QuoteOutcome::Priced;
}

PriceRun::PriceRun(DATABASE& investments, const QuoteContext& context, PriceRunObserver& observer)
    : investments_(investments), context_(context), observer_(observer), report_(context.logPath, nullptr) {}

bool PriceRun::Run(std::span<const long> recordNumbers) {
    for (const long recordNumber : recordNumbers)
        if (IsStopped(context_.stopFd) || !Update(recordNumber))
            break;
    return investments_.Sync() == 0;
}

bool PriceRun::Update(long recordNumber) {
    PriceRunResult result;
    if (!ReadInvestment(investments_, recordNumber, &result.before)) {
        report_.LogText("Database Read() error -1\n");
        observer_.Done(result);
        return false;
    }
    result.after = result.before;
    const std::string ticker(FieldText(result.before.Ticker));
    // Without a ticker a page could only give the price of something else.
    if (IsBlank(ticker)) {
        result.outcome = QuoteOutcome::NoTicker;
        report_.Log("No ticker for '" + std::string(FieldText(result.before.Name)) + "'\n");
    } else if (!Ask(ticker, &result)) {
        return false;
    } else if (result.outcome != QuoteOutcome::Failed &&
               investments_.Write(recordNumber, &result.after) != 0) {
        result.outcome = QuoteOutcome::NotSaved;
    }
    observer_.Done(result);
    return result.outcome != QuoteOutcome::Failed && result.outcome != QuoteOutcome::NotSaved;
}

bool PriceRun::Ask(const std::string& ticker, PriceRunResult* result) {
    report_.Log("Checking price for '" + ticker + "'\n");
    observer_.Asking(ticker);
    RefusalObserver& watcher = observer_.Watcher();
    context_.observer = &watcher;
    result->quote = GetPriceQuote(ticker.c_str(), context_);
    // Whatever a call that was cut short answers, it says nothing about the price.
    if (IsStopped(context_.stopFd))
        return false;
    report_.LogNumber("GetPriceQuote() returned ", result->quote);
    result->outcome = ApplyQuote(result->after, result->quote);
    result->refusedHost = watcher.RefusedHost();
    return true;
}
