#include <sstream>

#include "DataFolder.h"
#include "LoopbackServer.h"
#include "QuoteTest.h"
#include "quotes/run/PriceRun.h"

namespace {

// Writes down what it is told, at 1DEL deletes the record in hand, and at 1STOP stops the run.
class Run : public QuoteTest, public PriceRunObserver {
  protected:
    void Asking(const std::string& ticker) override {
        told_ << ticker << "? ";
        if (ticker == "1DEL")
            file_.Delete(numbers_[0]);
        if (ticker == "1STOP")
            eventfd_write(context_.stopFd, 1);
    }
    void Done(const PriceRunResult& result) override {
        static const char* const outcomes[] = {"priced", "unknown", "no ticker",
                                               "failed", "lost",    "not saved"};
        told_ << outcomes[static_cast<int>(result.outcome)] << ' ' << result.before.Price << '>'
              << result.after.Price << ' ' << result.quote << ", ";
    }

    DataFolder data_;
    DATABASE file_{data_.File("invest.db").c_str()};
    std::vector<long> numbers_;
    std::ostringstream told_;
};

TEST_F(Run, TellsWhatCameOfEachInvestment) {
    LoopbackServer server([](const std::string& request) { return Reply{{"@>" + request.substr(5)}}; });
    folder_.Write("Quorvan.cfg", "net " + server.Host() + " / @ 1\n");
    // A ticker is the price that its page shall have.
    const std::pair<std::vector<const char*>, const char*> cases[] = {
        {{"12", " ", "1e39", "13"},
         "12? priced 10>12 12, no ticker 10>10 -inf, 1e39? unknown 10>10 -4, 13? priced 10>13 13, "
         "lost 0>0 -inf, "},
        {{"11", "0", "12"}, "11? priced 10>11 11, 0? failed 10>10 0, "},
        {{"1DEL", "12"}, "1DEL? not saved 10>1 1, "},
        {{"11", "1STOP", "12"}, "11? priced 10>11 11, 1STOP? "},
    };
    for (const auto& [tickers, told] : cases) {
        numbers_.clear();
        told_.str("");
        for (const char* ticker : tickers) {
            INVESTMENT_DATA record = MakeInvestment("A", "Name");
            CopyText(record.Ticker, ticker);
            numbers_.push_back(file_.Append(&record));
        }
        numbers_.push_back(numbers_.back() + 1); // which is not there
        EXPECT_TRUE(PriceRun(file_, context_, *this).Run(numbers_));
        EXPECT_EQ(told_.str(), told);
    }
}

} // namespace
