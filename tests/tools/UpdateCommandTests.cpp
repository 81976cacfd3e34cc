#include "CommandTest.h"
#include "quotes/LoopbackServer.h"

namespace {

// Portfolio A with the tickers UP, DOWN and none, B with GO\tNE. The pages of the server hold
// what a test puts into `pages_`.
class UpdateCommand : public HomeTest {
  protected:
    UpdateCommand() {
        home_.Write("Quorvan.ini", "[GENERAL]\nIsConnectedURL=127.0.0.1\n");
        home_.Write("Quorvan.cfg", "net " + server_.Host() + " / @ 1\n");
        for (const char* portfolio : {"A", "B"})
            home_.AddPortfolio(portfolio);
        for (const auto& [portfolio, ticker] :
             {std::pair{"A", "UP"}, {"A", "DOWN"}, {"A", ""}, {"B", "GO\tNE"}})
            home_.AddInvestment(
                MakeInvestment(portfolio, std::string("Name of ") + ticker, 2, 10, "Fund", ticker));
    }

    const std::string in_ = "cd '" + home_.Path() + "'; ";
    std::map<std::string, Reply> pages_ = {{"UP", {{"@>12.5<"}}}, {"DOWN", {{"@>9.75<"}}}};
    LoopbackServer server_{[this](const std::string& request) {
        const std::string ticker = request.substr(5, request.find(' ', 5) - 5);
        if (pages_[ticker].end == Reply::End::Hold)
            std::system(("kill -INT $(cat " + home_.File("process") + ")").c_str());
        return pages_[ticker];
    }};
};

TEST_F(UpdateCommand, EndsWithAStatusForEachThingThatCanHappen) {
    constexpr const char* notConnected =
        "quorvan-cli: No Internet connection found! Please establish your connection and try again.\n";
    pages_["GO\tNE"] = {{"nothing"}};
    Expect(
        in_ + "update() { quorvan-cli update --home . \"$@\"; }; ",
        {{"update A", "UP\t10.00\t12.50\t+2.50\nDOWN\t10.00\t9.75\t-0.25\nName of \tno ticker\n2 of 3 "
                      "investments priced\n"},
         {"update B --ticker up A --ticker \"$(printf 'GO\\tNE')\"",
          "GO\\tNE\tno price: marker not found in the 7 bytes received, which begin: nothing\n"
          "UP\t12.50\t12.50\t0.00\n1 of 2 investments priced, 1 without a price\n",
          "", 3},
         {"update --all --ticker UP --json",
          R"({"portfolio":"A","name":"Name of UP","ticker":"UP","old":12.5,"new":12.5,"change":0.0,"why":null})"
          "\n"},
         {"echo 'net no..such..host / @ 1' >Quorvan.cfg; update B B",
          "GO\\tNE\tno price: failed: gethostbyname() error: the name does not resolve\n"
          "0 of 1 investment priced, 1 without a price\n",
          "", 3},
         {"rm Quorvan.cfg; update A --ticker UP",
          "UP\tno price: failed: the file ./Quorvan.cfg cannot be read\n0 of 1 investment priced\n",
          notConnected},
         {"echo >Quorvan.ini; update A", "", notConnected},
         {"update a", "", "but \"A\""},
         {"update --ticker Lost --ticker GONE A", "",
          "the ticker GONE\nquorvan-cli: no investment there has the ticker Lost\n"},
         {"update", "", "a PORTFOLIO or --all", 2},
         {"update A --all", "", "excludes", 2}});
    EXPECT_EQ(Printed(in_ + "cat backups/*.db.* | grep -c 'Name of' -a"), "1\n");
}

TEST_F(UpdateCommand, RewritesOneLineOnATerminalAndStopsAtOnce) {
    EXPECT_EQ(
        Printed(in_ + "script -qec 'quorvan-cli update --home . A' /dev/null"),
        "\r\x1B[K1 of 3: UP\r\x1B[K2 of 3: DOWN\r\x1B[KName of \tno ticker\r\n2 of 3 investments priced\r\n");
    pages_["DOWN"].end = Reply::End::Hold;
    pages_["UP"] = {{"@>13.5<"}};
    EXPECT_EQ(folder_.Run(in_ + "sh -c 'echo $$ >process; exec quorvan-cli update --home . A'"), 130);
    EXPECT_TRUE(folder_.Complains("quorvan-cli: stopped; what was not asked for yet is as it was\n"));
    EXPECT_EQ(Printed(in_ + "quorvan-cli db invest.db query --format tsv | cut -f 9 | xargs"),
              "Price 13.5 9.75 10 10\n");
}

} // namespace
