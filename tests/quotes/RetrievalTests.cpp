#include <gtest/gtest.h>

#include <cstdlib>
#include <future>
#include <netdb.h>
#include <poll.h>
#include <semaphore>
#include <string>
#include <vector>

#include "QuoteTest.h"
#include "TlsServer.h"
#include "quotes/HostLookup.h"
#include "quotes/LastConnection.h"
#include "quotes/QuoteObserver.h"
#include "quotes/StopSignal.h"

namespace {

using namespace std::string_literals;
using End = Reply::End;

// Fails at once and asks no name server.
constexpr const char* NoSuchHost = "no..such..host";

Reply Redirect(const std::string& address) {
    return {{"HTTP/1.0 302 Found\r\nLocation: " + address + "\r\nContent-Length: 0\r\n\r\n"}};
}

// Lets a server that replies in step send its next piece.
struct StepByStep : QuoteObserver {
    void PieceReceived(std::string_view piece) override { server->Taken(piece.size()); }
    LoopbackServer* server = nullptr;
};

class Retrieval : public QuoteTest {
  protected:
    Retrieval() {
        setenv("no_proxy", "*", 1);
        identity_.AddCertificateTo(caFile_);
        context_.caFile = caFile_.c_str();
        context_.sourcePath = sourcePath_.c_str();
        context_.lastConnection = &lastConnection_;
    }

    // The answer for the ticker ABC, with the lines as the source file.
    float Quote(const std::string& lines) {
        folder_.Write("Quorvan.cfg", lines);
        static_cast<void>(Log());
        return GetPriceQuote("ABC", context_);
    }
    float Ask(const std::string& host) { return Quote("net " + host + " /q?s= Last 3"); }
    // The text, which may leave out the last line's end, is at the end of the log.
    void ExpectLogsEnd(const std::string& text) {
        const std::string log = Log();
        const std::size_t at = log.rfind(text);
        EXPECT_TRUE(at != log.npos && log.find('\n', at + text.size() - 1) == log.size() - 1) << log << text;
    }
    // What the call answers when it is stopped once it has come so far.
    template <class Call, class Wait>
    auto Stopped(Call call, Wait comesSoFar) {
        auto answer = std::async(std::launch::async, call);
        comesSoFar();
        eventfd_write(context_.stopFd, 1);
        const auto answered = answer.get();
        eventfd_t count = 0;
        eventfd_read(context_.stopFd, &count);
        return answered;
    }
    template <class Wait>
    void ExpectCancelled(const std::string& host, Wait comesSoFar, const std::string& last = "") {
        EXPECT_EQ(Stopped([&] { return Ask(host); }, comesSoFar), QuoteCancelled);
        ExpectLogsEnd(last + "cancelled\n");
    }

    TlsIdentity identity_{"IP:127.0.0.1"};
    std::string caFile_ = folder_.File("ca.pem");
    std::string sourcePath_ = folder_.File("Quorvan.cfg");
    LastConnection lastConnection_;
};

const std::string Page = "HTTP/1.0 200 OK\r\n\r\n<td>Last</td><td><b>45 3/8</b></td>";
const std::string Asked = "In GetQuote\n";
const std::string Created = Asked + "gethostname() ok\nsocket created ok\n";
const std::string NoPrice = "Returning price = -4.00\n";

struct Answered {
    Reply reply;
    std::string log;
    float price;
    int redirects = 0;
};

TEST_F(Retrieval, AsksByABareRequestAndLogsEveryStep) {
    const std::string request = "GET /q?s=ABC HTTP/1.0\n\n";
    const std::string found = "found tag\nskipped ok\nvalue string is '";
    const std::string priced = found + "45'\nReturning price = 45.38\nPrice = 45.38\n";
    const Answered cases[] = {
        {{{Page}}, priced, 45.375F},
        {{{Page}, End::Hold}, priced, 45.375F},
        {{{Page}, End::Endless}, priced, 45.375F},
        // Each piece is read as it arrives.
        {{{"La", "st>7", "Last>>>8"}, {}, true}, found + "8'\nReturning price = 8.00\nPrice = 8.00\n", 8},
        {{{"Last<", "b>>>7 ", "1/2"}, {}, true}, found + "7'\nReturning price = 7.00\nPrice = 7.00\n", 7},
        {{{"Last</td>"}}, "found tag\nreceived zero bytes\n" + NoPrice, NoQuote},
        {{{"\0\xFF%s%n\x1B[2J"s}}, "received zero bytes\n" + NoPrice, NoQuote},
        {{{"Last></>>%s%n%s"}}, found + "%s%n%s'\nReturning price = 0.00\n", 0},
        {{}, "received zero bytes\n" + NoPrice, NoQuote},
        {{{}, End::Reset}, "recv() error\n" + NoPrice, NoQuote},
    };
    const std::string asked = "Checking 'HOST/q?s=ABC'\n" + Created + "connected ok\n" + request;
    StepByStep steps;
    context_.observer = &steps;
    for (const auto& c : cases) {
        LoopbackServer server(c.reply);
        steps.server = &server;
        EXPECT_EQ(Ask(server.Host()), c.price) << c.log;
        EXPECT_EQ(Log(), asked + c.log);
        EXPECT_EQ(server.Requests(), std::vector{request});
    }
}

TEST_F(Retrieval, ScansAPageBehindTlsInOnePiece) {
    std::vector<std::string> bytes;
    for (const char byte : Page)
        bytes.emplace_back(1, byte);
    TlsServer server(identity_, [&](const std::string&) { return Reply{bytes}; });
    EXPECT_EQ(GetQuote(server.Host().c_str(), "q?s=B C#\xC3\xA4%20\n", "Last", 3, context_), 45.375F);
    const std::string request = server.Requests().at(0);
    EXPECT_TRUE(request.starts_with("GET /q?s=B%20C%23%C3%A4%20%0A HTTP/1.1\r\n")) << request;
    EXPECT_NE(request.find("\r\nUser-Agent: Quorvan\r\n"), request.npos) << request;
    EXPECT_EQ(Log(), Asked + "connected to 127.0.0.1 port " + std::to_string(server.Port()) +
                         "\nreceived 35 bytes\nfound tag\nskipped ok\nvalue string is '45'\n"
                         "Returning price = 45.38\n");
}

TEST_F(Retrieval, OnceAskedTheAnswerBehindTlsCountsWhateverItsEnd) {
    LoopbackServer plain(Reply{{Page}});
    const Answered cases[] = {
        {{{Page}}, "value string is '45'\n", 45.375F, 5},
        {{{Page}}, "https error: Maximum (5) redirects followed\n", NoQuote, 6},
        {Redirect("http://" + plain.Host()), "https error: Protocol \"http\" not supported", NoQuote},
        {{{"HTTP/1.0 404 Not Found\r\n\r\n" + Page}}, "value string is '45'\n", 45.375F},
        {{{Page, std::string(100'000, 'x')}, End::Endless}, "the page has more than 10 MB\n", 45.375F},
        {{}, "https error: ", NoQuote},
        {{{Page.substr(0, 30)}, End::Reset}, "https error: ", NoQuote},
        {{{"HTTP/1.0 200 OK\r\nContent-Length: 999\r\n\r\n" + Page}}, "https error: ", 45.375F},
    };
    for (const auto& c : cases) {
        int redirects = c.redirects;
        TlsServer server(identity_,
                         [&](const std::string&) { return redirects-- > 0 ? Redirect("/") : c.reply; });
        EXPECT_EQ(Ask(server.Host()), c.price) << c.log;
        const std::string log = Log();
        EXPECT_NE(log.find(c.log), std::string::npos) << log;
    }
    EXPECT_TRUE(plain.Requests().empty());
}

TEST_F(Retrieval, SaysWhyThereIsNoConnection) {
    const auto answer = [](const std::string&) { return Reply{{Page}}; };
    const TlsIdentity stranger("IP:127.0.0.1");
    const TlsIdentity otherName("DNS:quotes.example");
    otherName.AddCertificateTo(caFile_);
    TlsServer unknown(stranger, answer);
    TlsServer misnamed(otherName, answer);
    const std::string elsewhere = "https://localhost" + unknown.Host().substr(unknown.Host().rfind(':'));
    TlsServer redirecting(identity_, [&](const std::string&) { return Redirect(elsewhere); });
    struct : QuoteObserver {
        void CertificateRefused(const char* host) override { refused = host; }
        std::string refused;
    } observer;
    context_.observer = &observer;
    const LoopbackSocket refusing;
    const struct {
        std::string host, log;
        float result = QuoteNetworkFailure;
    } cases[] = {
        {refusing.Host(), Created + "connect() error\n"},
        {NoSuchHost, Asked + "gethostbyname() error\n", NoQuote},
        {"h:port", "'h:port': the host is none of NAME, NAME:PORT and https://NAME[:PORT]\n", NoQuote},
        {unknown.Host(), "https error: SSL certificate problem"},
        {misnamed.Host(), "no alternative certificate subject name matches"},
        {"https://" + refusing.Host(), Asked + "https error: Failed to connect"},
        {"https://"s + NoSuchHost, Asked + "https error: Could not resolve host", NoQuote},
        {redirecting.Host(), "https error: SSL certificate problem"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(Ask(c.host), c.result) << c.host;
        ExpectLogsEnd(c.log);
    }
    EXPECT_EQ(observer.refused, "localhost");
    EXPECT_TRUE(unknown.Requests().empty() && misnamed.Requests().empty());
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
    const std::tuple<std::string, float, std::size_t> cases[] = {
        {"\n" + line("4"), NoQuote, 0},
        {nowhere + line("42.5") + line("7"), 42.5F, 1},
        {refused + line("42.5"), 42.5F, 1},
        {line("0") + line("-3") + line("7"), 7, 3},
        {line("-2") + line("7"), QuoteSearchEnded, 1},
        // Only the last line read can leave a status other than "no quote".
        {refused, QuoteNetworkFailure, 0},
        {line("0"), 0, 1},
        {line("0") + comment, NoQuote, 1},
        {line("0") + "\n", NoQuote, 1},
        {refused + "a line of four fields\n", NoQuote, 0},
        {"a line of four\n" + line("7") + comment, 7, 1},
        // Path and ticker have room for 127 bytes.
        {line(std::string(121, '0') + '7'), 7, 1},
        {line(std::string(122, '0') + '7'), NoQuote, 0},
    };
    std::size_t before = 0;
    for (const auto& [lines, price, requests] : cases) {
        EXPECT_EQ(Quote(lines), price) << lines;
        EXPECT_EQ(server.Requests().size() - before, requests) << lines;
        before = server.Requests().size();
    }
    EXPECT_EQ(GetPriceQuoteFrom(refused + line("7"), "ABC", {}), 7);
    static_cast<void>(Log());
    EXPECT_EQ(GetPriceQuoteFrom(comment, "ABC", context_), NoQuote);
    EXPECT_EQ(Log(), "no source to ask\n");
    context_.sourcePath = "/nowhere/Quorvan.cfg";
    EXPECT_EQ(GetPriceQuote("ABC", context_), NoQuoteSources);
    EXPECT_EQ(Log(), "Unable to open '/nowhere/Quorvan.cfg'\n");
}

TEST_F(Retrieval, StopsAtOnceWhereverItIs) {
    for (const Reply& reply : {Reply{{}, End::Hold}, Reply{{"Last>"}, End::Hold}, Reply{{"x"}, End::Endless},
                               Reply{{"Last>", ">"}, End::Endless}}) {
        LoopbackServer server(reply);
        ExpectCancelled(server.Host(), [&] { EXPECT_TRUE(server.WaitFor(1)); });
        EXPECT_TRUE(server.WaitFor(1, 1));
        if (reply.end == End::Endless)
            continue; // behind TLS a page has its end
        TlsServer tls(
            identity_, [&](const std::string&) { return reply; });
        ExpectCancelled(tls.Host(), [&] { EXPECT_TRUE(tls.WaitFor(1)); });
        EXPECT_TRUE(tls.WaitFor(1, 1));
    }
    // A server that accepts nobody: one waits for its greeting, and leaves no place in the queue.
    const LoopbackSocket deaf;
    listen(deaf.Fd(), 0);
    EXPECT_EQ(WaitUnlessStopped(deaf.Fd(), POLLIN, context_.stopFd, 0), Waited::NotYet);
    pollfd connection{deaf.Fd(), POLLIN, 0};
    ExpectCancelled(
        "https://" + deaf.Host(), [&] { EXPECT_EQ(poll(&connection, 1, 10'000), 1); });
    const auto connects = [&] {
        for (int i = 0; i < 10'000 && !folder_.Read("log").ends_with(Created); ++i)
            poll(nullptr, 0, 1);
    };
    ExpectCancelled(deaf.Host(), connects, Created);
    // One that is not asked, since it is to stop already.
    LoopbackServer server(Reply{{Page}});
    eventfd_write(context_.stopFd, 1);
    for (const std::string& host : {server.Host(), "https://" + server.Host()})
        EXPECT_EQ(Ask(host), QuoteCancelled);
    EXPECT_TRUE(server.Requests().empty());
    EXPECT_FALSE(IsConnected("127.0.0.1", context_.stopFd));
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
    const auto lookUp = [&] { return LookUpHost("localhost", context_.stopFd, &address, slow); };
    EXPECT_EQ(Stopped(lookUp, [] { resolving.acquire(); }), HostLookup::Stopped);
    resolverMayEnd.release();
    resolverEnded.acquire();
    EXPECT_EQ(address.s_addr, 0U);
    // The program may end while a resolver is still at work.
    EXPECT_EQ(Stopped(lookUp, [] { resolving.acquire(); }), HostLookup::Stopped);
}

TEST_F(Retrieval, ClosesAConnectionWhileTheNextServerThinks) {
    LoopbackServer server(Reply{{Page}, End::Hold}); // serves nobody else before the client goes
    EXPECT_EQ(Ask(server.Host()), 45.375F);
    EXPECT_EQ(Ask(server.Host()), 45.375F);
    EXPECT_TRUE(server.WaitFor(1, 1));
    lastConnection_.Close();
    EXPECT_TRUE(server.WaitFor(2, 2));
    context_.lastConnection = nullptr;
    EXPECT_EQ(Ask(server.Host()), 45.375F);
    EXPECT_TRUE(server.WaitFor(3, 3));
}

TEST_F(Retrieval, TheNetworkIsThereWhenANameResolves) {
    if (!gethostbyname("localhost"))
        GTEST_SKIP() << "this machine knows no name at all, not even its own";
    for (const int stopFd : {-1, context_.stopFd})
        for (const auto& [name, there] :
             {std::pair{"localhost", true}, {"127.0.0.1", true}, {NoSuchHost, false}, {"", false}})
            EXPECT_EQ(IsConnected(name, stopFd), there) << name;
}

} // namespace
