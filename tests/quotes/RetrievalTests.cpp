#include <gtest/gtest.h>

#include <future>
#include <netdb.h>
#include <poll.h>
#include <semaphore>
#include <string>
#include <vector>

#include "LoopbackServer.h"
#include "QuoteTest.h"
#include "quotes/HostLookup.h"
#include "quotes/LastConnection.h"
#include "quotes/QuoteObserver.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteScanner.h"

namespace {

using namespace std::string_literals;

// Fails at once and asks no name server.
constexpr const char* NoSuchHost = "no..such..host";

// Lets a server that replies in step send its next piece.
class StepByStep : public QuoteObserver {
  public:
    explicit StepByStep(LoopbackServer& server) : server_(server) {}
    void PieceReceived(std::string_view piece) override { server_.Taken(piece.size()); }

  private:
    LoopbackServer& server_;
};

class Retrieval : public QuoteTest {
  protected:
    Retrieval() {
        context_.sourcePath = sourcePath_.c_str();
        context_.lastConnection = &lastConnection_;
    }

    // The answer for the ticker ABC, with the lines as the source file.
    float Quote(const std::string& lines) {
        folder_.Write("Quorvan.cfg", lines);
        static_cast<void>(Log());
        return GetPriceQuote("ABC", context_);
    }
    std::future<float> QuoteMeanwhile(const std::string& lines) {
        return std::async(std::launch::async, [this, lines] { return Quote(lines); });
    }

    std::string sourcePath_ = folder_.File("Quorvan.cfg");
    LastConnection lastConnection_;
};

std::string Replace(std::string text, const std::string& from, const std::string& to) {
    for (std::size_t at = text.find(from); at != text.npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

const std::string Page = "HTTP/1.0 200 OK\r\n\r\n<td>Last</td><td><b>45 3/8</b></td>";
const std::string Before = "Checking 'HOST/q?s=ABC'\nIn GetQuote\ngethostname() ok\nsocket created ok\n";
const std::string Asked = Before + "connected ok\nGET /q?s=ABC HTTP/1.0\n\n";
const std::string NoPrice = "Returning price = -4.00\n";

TEST_F(Retrieval, AsksByABareRequestAndLogsEveryStep) {
    const std::string priced = "found tag\nskipped ok\nvalue string is '45'\n"
                               "Returning price = 45.38\nPrice = 45.38\n";
    const struct {
        Reply reply;
        int skip;
        float price;
        std::string log; // behind the request
    } cases[] = {
        {{{Page}}, 3, 45.375F, priced},
        {{{Page}, Reply::End::Hold}, 3, 45.375F, priced},
        {{{Page}, Reply::End::Endless}, 3, 45.375F, priced},
        {{{"Last</td>"}}, 2, NoQuote, "found tag\nreceived zero bytes\n" + NoPrice},
        {{{"\0\xFF%s%n\x1B[2J"s}}, 2, NoQuote, "received zero bytes\n" + NoPrice},
        {{{"Last></>%s%n%s"}},
         2,
         0,
         "found tag\nskipped ok\nvalue string is '%s%n%s'\nReturning price = 0.00\n"},
        {{{}}, 2, NoQuote, "received zero bytes\n" + NoPrice},
        {{{}, Reply::End::Reset}, 2, NoQuote, "recv() error\n" + NoPrice},
    };
    for (const auto& c : cases) {
        LoopbackServer server(c.reply);
        EXPECT_EQ(Quote("net " + server.Host() + " /q?s= Last " + std::to_string(c.skip)), c.price) << c.log;
        EXPECT_EQ(Replace(Log(), server.Host(), "HOST"), Asked + c.log);
        EXPECT_EQ(server.Requests(), std::vector<std::string>{"GET /q?s=ABC HTTP/1.0\n\n"});
    }
}

TEST_F(Retrieval, SaysWhyThereIsNoConnection) {
    const LoopbackSocket refusing;
    EXPECT_EQ(Quote("net " + refusing.Host() + " /q?s= Last 3"), QuoteNetworkFailure);
    EXPECT_EQ(Replace(Log(), refusing.Host(), "HOST"), Before + "connect() error\n");
    EXPECT_EQ(Quote("net "s + NoSuchHost + " /q?s= Last 3"), NoQuote);
    EXPECT_EQ(Replace(Log(), NoSuchHost, "HOST"),
              "Checking 'HOST/q?s=ABC'\nIn GetQuote\ngethostbyname() error\n");
    EXPECT_EQ(Quote("net host:port /q?s= Last 3"), NoQuote);
    EXPECT_EQ(Log(), "Checking 'host:port/q?s=ABC'\nIn GetQuote\n"
                     "'host:port': the host is none of NAME, NAME:PORT and https://NAME[:PORT]\n");
    context_.sourcePath = "/nowhere/Quorvan.cfg";
    EXPECT_EQ(Quote(""), NoQuoteSources);
    EXPECT_EQ(Log(), "Unable to open '/nowhere/Quorvan.cfg'\n");
    EXPECT_EQ(GetPriceQuoteFrom("; nothing but a comment\n", "ABC", context_), NoQuote);
    EXPECT_EQ(Log(), "no source to ask\n");
}

TEST_F(Retrieval, TriesTheSourcesInOrder) {
    // The path names the price that the page shall have.
    LoopbackServer server([](const std::string& request) {
        return Reply{{"@>" + request.substr(5, request.find("/ABC") - 5) + "<"}};
    });
    const auto line = [&](const std::string& price) {
        return "net " + server.Host() + " /" + price + "/ @ 1\n";
    };
    const LoopbackSocket refusing;
    const std::string refused = "net " + refusing.Host() + " /q?s= Last 3\n";
    const std::string nowhere = "net "s + NoSuchHost + " /q?s= Last 3\n";
    const std::string comment = ";a comment that is long enough\n";
    const struct {
        std::string lines;
        float price;
        std::size_t requests;
    } cases[] = {
        {"", NoQuote, 0},
        {"\n" + line("4"), NoQuote, 0},
        {comment, NoQuote, 0},
        {nowhere + line("42.5") + line("7"), 42.5F, 1},
        {refused + line("42.5"), 42.5F, 1},
        {line("0") + line("-3") + line("7"), 7, 3},
        {line("-2") + line("7"), QuoteSearchEnded, 1},
        {line("7") + comment, 7, 1},
        // Only the last line read can leave a status other than "no quote".
        {refused, QuoteNetworkFailure, 0},
        {line("0"), 0, 1},
        {line("0") + comment, NoQuote, 1},
        {line("0") + "\n", NoQuote, 1},
        {refused + "a line of four fields\n", NoQuote, 0},
        {"a line of four\n" + line("7"), 7, 1},
        {"net " + server.Host() + " /" + std::string(124, 'p') + " @ 1\n" + line("7"), 7, 1},
    };
    std::size_t before = 0;
    for (const auto& c : cases) {
        EXPECT_EQ(Quote(c.lines), c.price) << c.lines;
        EXPECT_EQ(server.Requests().size() - before, c.requests) << c.lines;
        before = server.Requests().size();
    }
    const QuoteContext none;
    EXPECT_EQ(GetPriceQuoteFrom(refused + line("7"), "ABC", none), 7);
}

// A page in these pieces is read off the network as the scanner reads it.
TEST_F(Retrieval, ReadsEachPieceAsItArrives) {
    std::vector<std::vector<std::string>> pages{SingleBytes("#>\n<7 1/2")};
    for (std::size_t split = 1; split < Page.size(); ++split)
        pages.push_back({Page.substr(0, split), Page.substr(split)});
    QuoteReport nobody(nullptr, nullptr);
    for (const auto& pieces : pages) {
        const char* tag = pieces.size() == 2 ? "Last" : "#";
        const int skip = pieces.size() == 2 ? 3 : 1;
        QuoteScanner scanner(tag, skip, nobody);
        for (const std::string& piece : pieces) {
            if (scanner.Scan(piece))
                break;
        }
        LoopbackServer server(Reply{pieces, Reply::End::Close, true});
        StepByStep steps(server);
        context_.observer = &steps;
        EXPECT_EQ(GetQuote(server.Host().c_str(), "/", tag, skip, context_), scanner.Price()) << pieces[0];
    }
}

// Stops the call once the server has the request, and waits until the server saw the connection end.
TEST_F(Retrieval, StopsAtOnceWhereverTheServerIs) {
    const Reply replies[] = {{{}, Reply::End::Hold},
                             {{"Last>"}, Reply::End::Hold},
                             {{std::string(4096, 'x')}, Reply::End::Endless},
                             {{"Last>", std::string(4096, '>')}, Reply::End::Endless}};
    for (const Reply& reply : replies) {
        LoopbackServer server(reply);
        const StopSwitch stop;
        context_.stopFd = stop.Fd();
        auto quote = QuoteMeanwhile("net " + server.Host() + " /q?s= Last 1\nnet h /q Last 1");
        EXPECT_TRUE(server.WaitForRequests(1));
        stop.Stop();
        EXPECT_EQ(quote.get(), QuoteCancelled);
        EXPECT_TRUE(server.WaitForEnds(1));
        const std::string log = Log();
        EXPECT_TRUE(log.ends_with("\ncancelled\n")) << log;
    }
}

TEST_F(Retrieval, ClosesAConnectionWhileTheNextServerThinks) {
    LoopbackServer server(Reply{{Page}, Reply::End::Hold}); // serves nobody else before the client goes
    const std::string source = "net " + server.Host() + " /q?s= Last 3";
    EXPECT_EQ(Quote(source), 45.375F);
    EXPECT_EQ(Quote(source), 45.375F);
    EXPECT_TRUE(server.WaitForEnds(1));
    lastConnection_.Close();
    EXPECT_TRUE(server.WaitForEnds(2));
    context_.lastConnection = nullptr;
    EXPECT_EQ(Quote(source), 45.375F);
    EXPECT_TRUE(server.WaitForEnds(3));
}

TEST_F(Retrieval, StopsWhileItConnects) {
    // A server whose queue is full leaves further connections waiting.
    const LoopbackSocket server;
    ASSERT_EQ(listen(server.Fd(), 0), 0);
    sockaddr_in address{};
    socklen_t size = sizeof address;
    ASSERT_EQ(getsockname(server.Fd(), reinterpret_cast<sockaddr*>(&address), &size), 0);
    std::vector<int> waiting;
    while (waiting.size() < 64) {
        pollfd last{socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0), POLLOUT, 0};
        waiting.push_back(last.fd);
        if (connect(last.fd, reinterpret_cast<sockaddr*>(&address), size) != 0 && poll(&last, 1, 50) == 0)
            break;
    }
    auto quote = QuoteMeanwhile("net " + server.Host() + " /q?s= Last 1");
    while (folder_.Read("log").find("socket created ok\n") == std::string::npos)
        std::this_thread::yield();
    stop_.Stop();
    EXPECT_EQ(quote.get(), QuoteCancelled);
    for (const int fd : waiting)
        close(fd);
}

TEST_F(Retrieval, AsksNobodyWhenItIsToStopAlready) {
    LoopbackServer server(Reply{{Page}});
    stop_.Stop();
    EXPECT_EQ(Quote("net " + server.Host() + " /q?s= Last 3"), QuoteCancelled);
    EXPECT_EQ(Quote("net https://" + server.Host() + " /q?s= Last 3"), QuoteCancelled);
    EXPECT_TRUE(server.Requests().empty());
    EXPECT_FALSE(IsConnected("127.0.0.1", stop_.Fd()));
}

TEST_F(Retrieval, TheNetworkIsThereWhenANameResolves) {
    if (!gethostbyname("localhost"))
        GTEST_SKIP() << "this machine knows no name at all, not even its own";
    for (const int stopFd : {-1, stop_.Fd()})
        for (const auto& [name, there] :
             {std::pair{"localhost", true}, {"127.0.0.1", true}, {NoSuchHost, false}, {"", false}})
            EXPECT_EQ(IsConnected(name, stopFd), there) << name;
}

std::binary_semaphore resolving(0), resolverMayEnd(0), resolverEnded(0);

TEST_F(Retrieval, StopsWhileANameIsLookedUp) {
    const NameResolver slow = [](const char* name, in_addr* address) {
        resolving.release();
        resolverMayEnd.acquire();
        const bool found = ResolveName(name, address);
        resolverEnded.release();
        return found;
    };
    in_addr address{};
    // The program may end while a resolver is still at work: the second one.
    for (const bool resolverEnds : {true, false}) {
        const StopSwitch stop;
        auto lookup = std::async(std::launch::async,
                                 [&] { return LookUpHost("localhost", stop.Fd(), &address, slow); });
        resolving.acquire();
        stop.Stop();
        EXPECT_EQ(lookup.get(), HostLookup::Stopped);
        if (resolverEnds) {
            resolverMayEnd.release();
            resolverEnded.acquire();
            EXPECT_EQ(address.s_addr, 0U);
        }
    }
}

} // namespace
