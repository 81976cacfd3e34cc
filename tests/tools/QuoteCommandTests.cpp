#include "CommandTest.h"
#include "quotes/LoopbackServer.h"

namespace {

class QuoteCommandTest : public CommandTest {
  protected:
    QuoteCommandTest() { std::filesystem::create_directory(folder_.File("home")); }

    // A source on the server.
    std::string Source(const std::string& rest) const { return "net " + server_.Host() + rest; }

    std::map<std::string, Reply> pages_ = {
        {"/moved", {{"HTTP/1.0 301 Moved\r\nLocation: https://\x1B[2J\xFF\r\n\r\n"}}},
        {"/closes", {}},
        {"/comma", {{"Last>202,45<"}}},
        {"/cut", {{"Last>12 3"}}},
        {"/open", {{"Last>12 <"}}},
        {"/whole", {{"Last>12<sup>1</sup>/<sub>2</sub> of 20"}}},
        {"/q?s=", {{std::string(100, 'a') + "\x1B[2JLast\\\n</td><b>45 3/8</b>" + std::string(100, 'z')}}}};
    LoopbackServer server_{
        [this](const std::string& request) { return pages_[request.substr(4, request.find("ABC") - 4)]; }};
};

TEST_F(QuoteCommandTest, ShowsWhatEachSourceGives) {
    folder_.Write("home/Quorvan.cfg",
                  "one no..such..host /q?s= Last 2\ntwo fields\n" + Source(" /q?s= Last 2\n"));
    EXPECT_EQ(Printed("quorvan-cli quote --home home ABC"),
              "ABC\t45.38\nABC: looking in home/Quorvan.cfg\n"
              "source one: asking no..such..host for /q?s=ABC, marker 'Last', skip 2\n"
              "  failed: gethostbyname() error: the name does not resolve\n"
              "  no price, -4.00\n"
              "line 2 is no source: it has fewer than five fields\n"
              "source net: asking " +
                  server_.Host() + " for /q?s=ABC, marker 'Last', skip 2\n  connected to 127.0.0.1 port " +
                  std::to_string(server_.Port()) + "\n  marker found: ..." + std::string(56, 'a') +
                  "\\x1B[2J[Last]\\\\\\n</td><b>45 3/8</b>" + std::string(40, 'z') +
                  "...\n  price text '45' read as 45.0000\n  behind it '3/8</b>" + std::string(53, 'z') +
                  "': fraction 0.3750\n  price 45.38\n");
}

TEST_F(QuoteCommandTest, SaysWhyThereIsNoPrice) {
    // An empty line ends the list; nothing behind it is asked.
    folder_.Write("home/Quorvan.cfg", "; comment\n\n" + Source(" /q?s= Last 2\n"));
    const std::string source = "--source '" + Source(" /");
    Expect(
        "quorvan-cli quote ABC ",
        {{"DEF --home home", "ABC\t-4.00\nDEF\t-4.00\n",
          "line 2 ends the list, since it is empty or too short for a source\nthere is no source to ask\n"},
         {"--home nowhere", "ABC\t-3.00\n", "failed: the file nowhere/Quorvan.cfg cannot be read\n"},
         {source + "moved Last 1'", "ABC\t-4.00\n",
          "  marker not found in the 47 bytes received, which begin: HTTP/1.0 301 Moved\\r\\nLocation: "
          "https://\\x1B[2J\\xFF\\r\\n\\r\\n\n"},
         {source + "q?s= Last 9'", "ABC\t-4.00\n", "  the page ended before the skip count was used up"},
         {source + "q?s= Last 0'", "ABC\t0.00\n", "  price text 'Last\\\\' read as 0.0000\n"},
         {source + "q?s= Last 1'", "ABC\t15.00\n", "  careful: the price text is no number", 0},
         {source + "closes Last 1'", "ABC\t-4.00\n", "  the server closed the connection without"},
         {source + "cut Last 1'", "ABC\t12.00\n", "  careful: what was read as the price ends where a", 0},
         {source + "open Last 1'", "ABC\t12.00\n", "  careful: what was read as the price ends where a", 0},
         {source + "whole Last 1'", "ABC\t12.50\n", "of 20': fraction 0.5000\n  price 12.50\n", 0},
         {source + "comma Last 1'", "ABC\t202.00\n", "  careful: the price text is read only up to its", 0}});
}

} // namespace
