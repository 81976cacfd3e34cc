#pragma once

#include <span>
#include <string>

#include "app/model/RecordLayouts.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"

class DATABASE;

// What a look at the network, through a host that the person names for it, comes to: before a run.
enum class Connection { Found, NotFound, Cancelled };

// Says so in the debug log.
void LogConnection(const char* host, Connection connection, const char* logPath);

// What came of the question for an investment's price.
enum class QuoteOutcome {
    Priced,   // the record has a new price
    NoPrice,  // nobody knows a price; the record is marked so
    NoTicker, // there was nothing to ask for; the record is as it was
    Failed,   // the question could not be asked; the record is as it was
    NotRead,  // the record could not be read
    NotSaved  // there was an answer, but the record could not be written
};

// Brings the record up to date with what GetPriceQuote answered; writes nothing to a file. Priced, NoPrice or
// Failed.
//
// A price becomes the record's Price, the former one its PrevPrice; Value is the price times Shares in single
// precision, Date is today, and QuoteError is cleared. A price that is no price of this world (it or the
// value is beyond a float) counts as none. Without a price QuoteError is set and all else stays.
[[nodiscard]] QuoteOutcome ApplyQuote(INVESTMENT_DATA& record, float quote);

// What a run has to say of one investment.
struct PriceRunResult {
    QuoteOutcome outcome = QuoteOutcome::NotRead;
    INVESTMENT_DATA before{};     // the record as it was; zeroed when it could not be read
    INVESTMENT_DATA after{};      // and as it is to be
    float quote = QuoteCancelled; // what GetPriceQuote answered, if it was asked
    std::string refusedHost;      // whose certificate was refused, if that is why the question failed
};

// Is told how a run goes, on the run's thread. What is passed is borrowed for the call.
class PriceRunObserver {
  public:
    virtual ~PriceRunObserver() = default;

    // This ticker's price is about to be asked for.
    virtual void Asking(const std::string& ticker) = 0;
    // Who is to be told of that look-up, one that was told of none yet: the observer's own until the next.
    virtual RefusalObserver& Watcher() {
        watcher_ = {};
        return watcher_;
    }
    // An investment is done with. Failed, NotRead and NotSaved end the run.
    virtual void Done(const PriceRunResult& result) = 0;

  private:
    RefusalObserver watcher_;
};

// Brings the prices of investments up to date, one after another: reads each record, asks for its price,
// writes it back, and logs all that. It shows nothing and chooses no records. A local object of whoever
// starts the run, on a thread that may wait; what it is given is borrowed, and the file is the run's alone
// meanwhile.
class PriceRun {
  public:
    // The context is that of every look-up; its observer is not used. The run ends as soon as its stop
    // descriptor is readable, which another thread or a signal handler may bring about at any moment (with
    // an eventfd, say): the investment in hand is then as it was, or wholly up to date and told of.
    PriceRun(DATABASE& investments, const QuoteContext& context, PriceRunObserver& observer);

    // Goes through the records until one ends the run, or it is stopped. False when what was written may not
    // be on the disk.
    [[nodiscard]] bool Run(std::span<const long> recordNumbers);

  private:
    // False when the run ends with this investment.
    [[nodiscard]] bool Update(long recordNumber);
    // Asks for the price, and brings the record of the result up to date. False when the run is stopped.
    [[nodiscard]] bool Ask(const std::string& ticker, PriceRunResult* result);

    DATABASE& investments_;
    QuoteContext context_;
    PriceRunObserver& observer_;
    QuoteReport report_;
};
