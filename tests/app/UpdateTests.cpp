// Price updates of the whole program against a server on loopback.
#include "Program.h"

#include <atomic>
#include <cmath>
#include <map>
#include <semaphore>

#include <QProgressBar>

#include <dlfcn.h>
#include <netdb.h>

#include "db/FaultyFiles.h"
#include "quotes/TlsServer.h"
#include "quotes/run/PriceRun.h"

namespace {

constexpr const char* Title = "Getting current prices...";
constexpr const char* NoConnection =
    "No Internet connection found!\nPlease establish your connection and try again.";

std::counting_semaphore<> slowHostIsFound(0);

} // namespace

// In place of the system's resolver, which takes its time over one host.
extern "C" int getaddrinfo(const char* name, const char* service, const addrinfo* hints, addrinfo** found) {
    static const auto system = reinterpret_cast<decltype(&getaddrinfo)>(dlsym(RTLD_NEXT, "getaddrinfo"));
    if (std::string(name) != "slow.example")
        return system(name, service, hints, found);
    slowHostIsFound.acquire();
    return system("127.0.0.1", service, hints, found);
}

namespace {

INVESTMENT_DATA Holding(const char* ticker, float price, float previousPrice) {
    INVESTMENT_DATA record = MakeInvestment("A", ticker, 10, price);
    CopyText(record.Ticker, ticker);
    record.PrevPrice = previousPrice;
    return record;
}

// The program with investments RISE, FALL, SAME, FAIL and NEW of portfolio "A", and a server that knows some
// of their prices.
class PriceUpdate : public testing::Test, protected Program {
  protected:
    using Program::Run;

    PriceUpdate() {
        Write("Quorvan.ini", "[GENERAL]\nIsConnectedURL=127.0.0.1\n[DISPLAY]\n");
        Write("Quorvan.cfg", "local " + server_.Host() + " /quote/ Last 1\n");
        AddPortfolio("A");
        for (const char* ticker : {"RISE", "FALL", "SAME", "FAIL", "NEW"})
            AddInvestment(Holding(ticker, 11, NoPreviousPrice));
    }
    Program& Update() {
        return Then([] { Press(Main(), "Update button"); });
    }
    // The main window can be worked again and shows the prices of the file.
    Program& UntilDone() {
        return Await([] { return Main() && !Driver::Window(Title); });
    }
    Program& UntilPriced() {
        return Await([] { return std::string(Row(0)->Text(5)) == "12.50"; });
    }
    // Updates until the server is held at a ticker, and then does this.
    void UpdateUpTo(const char* ticker, std::size_t requests, Action action) {
        held_ = ticker;
        const auto asked = [this, requests] { return server_.Requests().size() == requests; };
        Update().When(asked, std::move(action));
    }
    void Watch(FaultyFiles& files) {
        Then([this, &files] { files.Watch(app_state->investments, File("invest.db")); });
    }
    INVESTMENT_DATA Record(long number) const {
        INVESTMENT_DATA record{};
        DATABASE(File("invest.db").c_str()).Read(number, &record);
        return record;
    }
    void ExpectUntouched(long number, const char* ticker) const {
        EXPECT_TRUE(AreSame(Record(number), Holding(ticker, 11, NoPreviousPrice))) << ticker;
    }

    std::string held_; // the server says nothing when it is asked for this ticker
    LoopbackServer server_{[this](const std::string& request) {
        static const std::map<std::string, std::string> pages = {
            {"RISE", "Last>12.5<"}, {"FALL", "Last>10 3/8<"}, {"SAME", "Last>11"}};
        const std::size_t begin = request.find("/quote/") + 7;
        const std::string ticker = request.substr(begin, request.find(' ', begin) - begin);
        if (ticker == held_)
            return Reply{{}, Reply::End::Hold};
        const auto page = pages.find(ticker);
        return Reply{{page == pages.end() ? "unknown" : page->second}};
    }};
};

TEST(ApplyQuote, ChangesWhatItShall) {
    using enum QuoteOutcome;
    for (const float quote : {12.5F, NoQuote, HUGE_VALF, 3e38F, 0.F, NoQuoteSources, std::nanf("")}) {
        const bool unknown = quote == NoQuote || quote > 1e38F; // or the value is beyond a float
        const QuoteOutcome outcome = quote == 12.5F ? Priced : unknown ? NoPrice : Failed;
        INVESTMENT_DATA record = Holding("T", 11, 5);
        INVESTMENT_DATA expected = outcome == Priced ? Holding("T", quote, 11) : record;
        const dbDATE began = Today();
        record.QuoteError = 7;
        expected.QuoteError = outcome == Priced ? 0 : outcome == NoPrice ? 1 : 7;
        EXPECT_EQ(ApplyQuote(record, quote), outcome) << quote;
        if (outcome == Priced)
            expected.Date = PackDate(record.Date) == PackDate(began) ? began : Today();
        EXPECT_TRUE(AreSame(record, expected)) << quote;
    }
}

// A row without a ticker is left out; the others show how their prices moved.
TEST_F(PriceUpdate, AsksForTheSelectedRowsThatHaveATicker) {
    AddInvestment(Holding(" ", 48200, NoPreviousPrice));
    FaultyFiles files;
    Watch(files);
    Mark({5, 0, 1, 2, 3});
    Update();
    UntilPriced().Then([&] {
        EXPECT_TRUE(files.HaveSynced());
        using enum PriceMove;
        const PriceMove moves[] = {Up, Down, Same, NotFound, Unknown, Unknown};
        for (int32 row = 0; row < 6; ++row)
            EXPECT_EQ(Row(row)->Movement(), moves[row]) << row;
        EXPECT_EQ(Total(), "Total Value: $482,558.75");
    });
    RunAndClose();
    ExpectUntouched(4, "NEW");
    const std::string log = Read("Quorvan.log");
    EXPECT_EQ(log.find("Checked '127.0.0.1', connection found ok\nChecking price for 'RISE'\n"), 0U) << log;
    EXPECT_NE(log.find("GetPriceQuote() returned -4.00\n"), std::string::npos) << log;
    EXPECT_EQ(server_.Requests().size(), 4U);
}

TEST_F(PriceUpdate, FromThePressToTheEndThereIsNoOtherCommand) {
    Write("Quorvan.ini", "[GENERAL]\nIsConnectedURL=slow.example\n[DISPLAY]\n");
    constexpr const char* waiting = "Looking for a connection";
    const auto press = [] {
        for (int presses = 0; presses < 2; ++presses)
            Press(Main(), "Update button");
        Window()->PostMessage(MessageInvestmentCopy);
        Choose("Other");
    };
    Mark({0}).Then(press);
    When(
        WindowShown(waiting), [] { Press(Driver::Window(waiting), "cancel button"); });
    Await([this] { return Read("Quorvan.log") == "Checked 'slow.example', cancelled\n"; }).Then(press);
    When(WindowShown(waiting), [] { slowHostIsFound.release(2); });
    UntilPriced().Expect({"RISE", "FALL", "SAME", "FAIL", "NEW"});
    Send(MessageInvestmentCut).Answer(NothingToTake); // taken again
    RunAndClose();
    EXPECT_EQ(server_.Requests().size(), 1U);
}

// Until its changes are on the disk another command would change the file at the same time.
TEST_F(PriceUpdate, ClosedHalfWayItGoesOnceTheFirstHalfIsOnTheDisk) {
    FaultyFiles files;
    std::atomic<bool> syncing = false;
    std::binary_semaphore go(0);
    files.may = [&](char call) {
        const bool first = call == 's' && !syncing.exchange(true);
        EXPECT_TRUE(!first || go.try_acquire_for(std::chrono::seconds(50)));
        return call != 's';
    };
    Watch(files);
    UpdateUpTo(
        "SAME", 3,
        [] {
            const auto* bar = Driver::Window(Title)->findChild<QProgressBar*>("Status Bar");
            EXPECT_TRUE(QTest::qWaitFor([&] { return bar->accessibleName() == "Checking: SAME"; }));
            EXPECT_EQ(bar->value() * 6, bar->maximum() * 3);
            Driver::Window(Title)->close();
        });
    Await([&] { return syncing.load(); }).When(QApplication::activeModalWidget, [&] {
        EXPECT_EQ(QApplication::activeModalWidget(), Driver::Window(Title));
        go.release();
    });
    Answer(NotKept);
    UntilDone().RunAndClose();
    EXPECT_EQ(Record(1).Price, 10.375F);
    ExpectUntouched(2, "SAME");
    EXPECT_TRUE(Read("Quorvan.log").ends_with("\ncancelled\n")); // and tells of no price
    EXPECT_EQ(server_.Requests().size(), 3U); // no reload is shown, and nobody was asked again
}

TEST_F(PriceUpdate, EndsWithAnAlertWhenNobodyCanBeAsked) {
    const TlsServer stranger(TlsIdentity(), [](const std::string&) { return Reply{}; });
    const std::string toStranger = "stranger " + stranger.Host() + " /a Last 1\n";
    constexpr const char* notTrusted =
        "The server 127.0.0.1 could not be trusted: its certificate was refused, and it was not asked for a "
        "price.\nIs the name in Quorvan.cfg right, and the date of this computer?";
    const struct {
        std::string host, sources;
        const char *alert, *logged;
    } cases[] = {{"127.0.0.1", "", NoConnection, "Unable to open '"},
                 {"127.0.0.1\r", "reset 127.0.0.1:1 /a Last 1\n", NoConnection, "connect() error\n"},
                 {"127.0.0.1", toStranger, notTrusted, "https error: SSL certificate problem"},
                 {"", ";\n", NoConnection, "Checked '', no connection found!\n"}};
    for (const auto& each : cases) {
        Then([&] {
            Write("Quorvan.ini", "[GENERAL]\nIsConnectedURL=" + each.host + "\n");
            Write("Quorvan.cfg", each.sources);
            if (each.sources.empty())
                std::filesystem::remove(File("Quorvan.cfg"));
        });
        Update().Answer(each.alert);
        UntilDone().Then([&] { EXPECT_NE(Read("Quorvan.log").find(each.logged), std::string::npos); });
    }
    RunAndClose();
    ExpectUntouched(0, "RISE");
}

TEST_F(PriceUpdate, EndsAtARecordThatIsNotReadOrWritten) {
    FaultyFiles files;
    Watch(files);
    Then([] { app_state->investments->Delete(1); });
    Update();
    UntilPriced().Then([&] { files.may = [](char call) { return call != 'w'; }; });
    Update().Answer(NotKept);
    UntilDone().RunAndClose();
    EXPECT_EQ(server_.Requests().size(), 2U);
    ExpectUntouched(2, "SAME");
}

TEST_F(PriceUpdate, TheProgramsEndStopsItAndTellsOfADiskThatFails) {
    FaultyFiles files;
    files.may = [](char call) { return call != 's'; };
    Watch(files);
    UpdateUpTo("FALL", 2, [] { be_app->PostMessage(B_QUIT_REQUESTED); });
    Answer(NotKept).Run();
    EXPECT_EQ(Record(0).Price, 12.5F);
    ExpectUntouched(1, "FALL");
}

} // namespace
