#include <tuple>

#include "CommandTest.h"
#include "DataFolder.h"
#include "quotes/LoopbackServer.h"
#include "util/FolderLock.h"

namespace {

// Portfolio A with the tickers UP, DOWN and none, B with GO\tNE. The pages of the server hold
// what a test puts into `pages_`.
class UpdateCommand : public CommandTest {
  protected:
    UpdateCommand() {
        home_.Write("Quorvan.ini", "[GENERAL]\nIsConnectedURL=127.0.0.1\n");
        home_.Write("Quorvan.cfg", "net " + server_.Host() + " / @ 1\n");
        for (const char* portfolio : {"A", "B"})
            home_.AddPortfolio(portfolio);
        for (const auto& [portfolio, ticker] :
             {std::pair{"A", "UP"}, {"A", "DOWN"}, {"A", ""}, {"B", "GO\tNE"}}) {
            INVESTMENT_DATA record = MakeInvestment(portfolio, std::string("Name of ") + ticker);
            CopyTextZeroed(record.Ticker, ticker);
            home_.AddInvestment(record);
        }
    }
    std::string Update(const std::string& arguments) const {
        return "quorvan-cli update --home '" + home_.Path() + "' " + arguments;
    }

    DataFolder home_;
    std::map<std::string, Reply> pages_ = {{"UP", {{"@>12.5<"}}}, {"DOWN", {{"@>9.75<"}}}};
    LoopbackServer server_{[this](const std::string& request) {
        const std::string ticker = request.substr(5, request.find(' ', 5) - 5);
        if (pages_[ticker].end == Reply::End::Hold)
            std::system(("kill -INT $(cat " + folder_.File("process") + ")").c_str());
        return pages_[ticker];
    }};
};

TEST_F(UpdateCommand, EndsWithAStatusForEachThingThatCanHappen) {
    constexpr const char* notConnected =
        "quorvan-cli: No Internet connection found! Please establish your connection and try again.\n";
    pages_["GO\tNE"] = {{"nothing"}};
    const std::tuple<const char*, const char*, int, const char*, const char*> cases[] = {
        {"", "A", 0,
         "UP\t10.00\t12.50\t+2.50\nDOWN\t10.00\t9.75\t-0.25\nName of \tno ticker\n2 of 3 investments "
         "priced\n",
         ""},
        {"", "B A --ticker UP \"$(printf 'GO\\tNE')\"", 3,
         "GO\\tNE\tno price: marker not found in the 7 bytes received, which begin: "
         "nothing\nUP\t12.50\t12.50\t0.00\n1 of 2 investments priced, 1 without a price\n",
         ""},
        {"", "--all --ticker UP --json", 0,
         R"({"portfolio":"A","name":"Name of UP","ticker":"UP","old":12.5,"new":12.5,"change":0.0,"why":null})"
         "\n",
         ""},
        {"echo 'net no..such..host / @ 1' >Quorvan.cfg", "B A A", 3,
         "GO\\tNE\tno price: failed: gethostbyname() error: the name does not resolve\n", ""},
        {"rm Quorvan.cfg", "A", 1, "UP\tno price: failed: the file ", notConnected},
        {"echo >Quorvan.ini", "A", 1, "", notConnected},
        {"", "a", 1, "", "but \"A\""},
        {"", "A --ticker GONE", 1, "", "quorvan-cli: no investment there has the ticker GONE\n"},
        {"", "", 2, "", "a PORTFOLIO or --all"},
        {"", "A --all", 2, "", "excludes"},
    };
    for (const auto& [before, arguments, status, output, errors] : cases) {
        ASSERT_EQ(folder_.Run("cd '" + home_.Path() + "'; " + before), 0);
        EXPECT_EQ(folder_.Run(Update(arguments)), status) << arguments << folder_.Errors();
        EXPECT_EQ(folder_.Output().substr(0, std::string(output).size()), output) << arguments;
        EXPECT_TRUE(folder_.Complains(errors));
    }
    EXPECT_EQ(
        Printed("cd '" + home_.Path() + "'/backups; cat portfol.db.* invest.db.* | grep -c 'Name of' -a"),
        "1\n");
}

TEST_F(UpdateCommand, RewritesOneLineOnATerminalAndStopsAtOnce) {
    EXPECT_TRUE(Works("script -qec \"" + Update("A") + "\" /dev/null"));
    EXPECT_EQ(
        folder_.Output(),
        "\r\x1B[K1 of 3: UP\r\x1B[K2 of 3: DOWN\r\x1B[KName of \tno ticker\r\n2 of 3 investments priced\r\n");
    pages_["DOWN"].end = Reply::End::Hold;
    pages_["UP"] = {{"@>13.5<"}};
    EXPECT_EQ(folder_.Run("sh -c \"echo \\$\\$ >process; exec " + Update("A") + "\""), 130);
    EXPECT_TRUE(folder_.Complains("quorvan-cli: stopped; what was not asked for yet is as it was\n"));
    EXPECT_EQ(
        Printed("quorvan-cli db '" + home_.File("invest.db") + "' query --format tsv | cut -f 9 | xargs"),
        "Price 13.5 9.75 10 10\n");
    FolderLock lock;
    ASSERT_EQ(lock.Take(home_.Path(), "quorvan"), FolderLock::Outcome::Taken);
    EXPECT_TRUE(folder_.Fails(Update("A"), 1, "in use by quorvan (process " + std::to_string(getpid())));
}

} // namespace
