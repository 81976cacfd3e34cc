// Price updates of the whole program against a server on loopback.
#include "Program.h"

#include <cmath>
#include <map>

#include "platform/StatusBar.h"
#include "quotes/LoopbackServer.h"
#include "quotes/PriceUpdate.h"
#include "quotes/QuoteRetrieval.h"

namespace {

constexpr const char* Title = "Getting current prices...";
constexpr const char* NotConnected =
    "No Internet connection found!\nPlease establish your connection and try again.";

INVESTMENT_DATA Holding(const char* ticker, float price, float previousPrice) {
    INVESTMENT_DATA record = MakeInvestment("A", ticker, 10, price);
    CopyText(record.Ticker, ticker);
    record.PrevPrice = previousPrice;
    return record;
}

dbDATE Today() {
    dbDATE date{};
    DATABASE(nullptr).SetToCurrentDate(&date);
    return date;
}

// The program with investments RISE, FALL, SAME, FAIL and NEW of portfolio "A", and a server that knows some
// of their prices.
class UpdateRun : public Program {
  public:
    UpdateRun() : server_([this](const std::string& request) { return AnswerTo(request); }) {
        Write("Quorvan.ini", "[GENERAL]\nIsConnectedURL=localhost\n[DISPLAY]\n");
        Write("Quorvan.cfg", "local " + server_.Host() + " /quote/ Last 1\n");
        AddPortfolio("A");
        for (const char* ticker : {"RISE", "FALL", "SAME", "FAIL", "NEW"})
            AddInvestment(Holding(ticker, 11, NoPreviousPrice));
    }

    UpdateRun& SelectRows(std::vector<int32> rows) {
        Then("select", [rows] {
            Locked([&] {
                for (const int32 row : rows)
                    List()->Select(row, true);
            });
        });
        return *this;
    }
    UpdateRun& Update() {
        Then("update", [] { Press(Main(), "Update button"); });
        return *this;
    }
    // The main window can be worked again and shows the prices of the file.
    UpdateRun& UntilDone() {
        When(
            "the progress window goes", [] { return Main() && !Driver::Window(Title); }, [] {});
        return *this;
    }
    INVESTMENT_DATA Record(long number) const {
        INVESTMENT_DATA record{};
        DATABASE(File("invest.db").c_str()).Read(number, &record);
        return record;
    }
    LoopbackServer& Server() { return server_; }
    // The server says nothing when it is asked for this ticker.
    void HoldAt(std::string ticker) { held_ = std::move(ticker); }
    static Driver::Condition Shown() { return WindowShown(Title); }

  private:
    Reply AnswerTo(const std::string& request) const {
        static const std::map<std::string, std::string> pages = {
            {"RISE", "Last>12.5<"}, {"FALL", "Last>10 3/8<"}, {"SAME", "Last>11"}, {"ZERO", "Last>N/A<"}};
        const std::size_t begin = request.find("/quote/") + 7;
        const std::string ticker = request.substr(begin, request.find(' ', begin) - begin);
        if (ticker == held_)
            return {{}, Reply::End::Hold};
        const auto page = pages.find(ticker);
        return {{page == pages.end() ? "unknown" : page->second}};
    }

    std::string held_;
    LoopbackServer server_;
};

} // namespace

TEST(ApplyQuote, ChangesWhatItShall) {
    struct Case {
        float quote;
        float shares;
        QuoteOutcome outcome;
        float price, previous, value;
        int error;
    };
    const float infinity = std::numeric_limits<float>::infinity();
    const Case cases[] = {
        {12.5F, 10, QuoteOutcome::Priced, 12.5F, 11, 125, 0},
        {NoQuote, 10, QuoteOutcome::NoPrice, 11, 5, 110, 1},
        {infinity, 10, QuoteOutcome::NoPrice, 11, 5, 110, 1},
        {3e38F, 10, QuoteOutcome::NoPrice, 11, 5, 110, 1},
        {0, 10, QuoteOutcome::Failed, 11, 5, 110, 7},
        {NoQuoteSources, 10, QuoteOutcome::Failed, 11, 5, 110, 7},
        {std::nanf(""), 10, QuoteOutcome::Failed, 11, 5, 110, 7},
    };
    for (const Case& each : cases) {
        INVESTMENT_DATA record = Holding("T", 11, 5);
        record.Shares = each.shares;
        record.QuoteError = 7;
        const INVESTMENT_DATA before = record;
        EXPECT_EQ(ApplyQuote(record, each.quote), each.outcome) << each.quote;
        EXPECT_EQ(record.Price, each.price) << each.quote;
        EXPECT_EQ(record.PrevPrice, each.previous) << each.quote;
        EXPECT_EQ(record.Value, each.value) << each.quote;
        EXPECT_EQ(record.QuoteError, each.error) << each.quote;
        const dbDATE date = each.outcome == QuoteOutcome::Priced ? Today() : before.Date;
        EXPECT_EQ(std::memcmp(&record.Date, &date, sizeof date), 0) << each.quote;
    }
}

TEST(PriceUpdate, RowsShowHowPricesMoved) {
    UpdateRun run;
    run.SelectRows({0, 1, 2, 3}).Update().UntilDone();
    run.When(
        "the new prices", [] { return std::string(Program::Row(0)->Text(5)) == "12.50"; },
        [] {
            const PriceMove moves[] = {PriceMove::Up, PriceMove::Down, PriceMove::Same, PriceMove::NotFound,
                                       PriceMove::Unknown};
            for (int32 row = 0; row < 5; ++row)
                EXPECT_EQ(Program::Row(row)->Movement(), moves[row]) << row;
            EXPECT_EQ(Program::Total(), "Total Value: $558.75");
        });
    run.Close();
    run.Run();
    EXPECT_EQ(run.Record(1).Price, 10.375F);
    EXPECT_EQ(run.Record(1).PrevPrice, 11);
    EXPECT_EQ(run.Record(4).QuoteError, 0);
    const std::string log = run.Read("Quorvan.log");
    EXPECT_EQ(log.find("Checked 'localhost', connection found ok\nChecking price for 'RISE'\n"), 0U) << log;
    EXPECT_NE(log.find("GetPriceQuote() returned -4.00\n"), std::string::npos) << log;
    EXPECT_EQ(run.Server().Requests().size(), 4U);
}

TEST(PriceUpdate, CancelledHalfWayItLeavesTheFirstHalfUpdated) {
    UpdateRun run;
    run.HoldAt("SAME");
    run.Update();
    run.When(
        "the third is asked for", [&] { return run.Server().Requests().size() == 3; },
        [] {
            const auto* bar = static_cast<BStatusBar*>(GetAppWindow(be_app, Title)->FindView("Status Bar"));
            EXPECT_EQ(bar->MaxValue(), 6);
            EXPECT_EQ(bar->CurrentValue(), 3);
            EXPECT_EQ(bar->Text(), " SAME");
            Driver::Window(Title)->close();
        });
    run.UntilDone().Close();
    run.Run();
    EXPECT_EQ(run.Record(0).Price, 12.5F);
    EXPECT_EQ(run.Record(1).Price, 10.375F);
    const INVESTMENT_DATA untouched = Holding("SAME", 11, NoPreviousPrice);
    const INVESTMENT_DATA third = run.Record(2);
    EXPECT_EQ(std::memcmp(&third, &untouched, sizeof third), 0);
    EXPECT_EQ(run.Server().Requests().size(), 3U); // no reload is shown, and nobody was asked again
}

TEST(PriceUpdate, AnInvestmentWithoutATickerKeepsItsPrice) {
    UpdateRun run;
    run.AddInvestment(Holding("", 48200, NoPreviousPrice));
    run.Select("A");
    run.When(
        "six rows", [] { return Program::Main() && Program::List()->CountItems() == 6; }, [] {});
    run.SelectRows({5, 0}).Update().UntilDone().Close();
    run.Run();
    EXPECT_EQ(run.Record(0).Price, 12.5F);
    EXPECT_EQ(run.Record(5).Price, 48200);
    EXPECT_EQ(run.Record(5).QuoteError, 0);
    EXPECT_EQ(run.Server().Requests().size(), 1U);
}

TEST(PriceUpdate, EndsWithAnAlertWhenNobodyCanBeAsked) {
    struct Case {
        const char* ini;
        const char* sources;
        const char* logged;
    };
    const Case cases[] = {
        {"[GENERAL]\nIsConnectedURL=localhost\n", nullptr, "Unable to open '"},
        {"[GENERAL]\nIsConnectedURL=localhost\n", "reset 127.0.0.1:1 /a Last 1\n", "connect() error\n"},
        {"[GENERAL]\n", "", "Checked '', no connection found!\n"},
    };
    UpdateRun run;
    const INVESTMENT_DATA before = run.Record(0);
    for (const Case& each : cases) {
        run.Then("prepare", [&run, &each] {
            run.Write("Quorvan.ini", each.ini);
            std::filesystem::remove(run.File("Quorvan.cfg"));
            if (each.sources)
                run.Write("Quorvan.cfg", each.sources);
        });
        run.Update();
        run.Answer(NotConnected, "Ok");
        run.UntilDone();
        run.Then("the log", [&run, &each] {
            EXPECT_NE(run.Read("Quorvan.log").find(each.logged), std::string::npos)
                << run.Read("Quorvan.log");
        });
    }
    run.Close();
    run.Run();
    const INVESTMENT_DATA after = run.Record(0);
    EXPECT_EQ(std::memcmp(&after, &before, sizeof after), 0);
}

TEST(PriceUpdate, TheProgramsEndStopsIt) {
    UpdateRun run;
    run.HoldAt("FALL");
    run.Update();
    run.When(
        "the second is asked for", [&] { return run.Server().Requests().size() == 2; },
        [] { be_app->PostMessage(B_QUIT_REQUESTED); });
    run.Run();
    EXPECT_EQ(run.Record(0).Price, 12.5F);
    EXPECT_EQ(run.Record(1).Price, 11);
}
