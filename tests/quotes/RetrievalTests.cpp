#include <future>
#include <poll.h>
#include <semaphore>

#include "QuoteTest.h"
#include "TlsServer.h"
#include "quotes/Host.h"
#include "quotes/QuoteReport.h"

namespace {

using namespace std::string_literals;
using End = Reply::End;

// Fails at once and asks no name server.
constexpr const char* NoSuchHost = "no..such..host";

Reply Redirect(const std::string& address) {
    return {{"HTTP/1.0 302 Found\r\nLocation: " + address + "\r\nContent-Length: 0\r\n\r\n"}};
}

class Retrieval : public QuoteTest {
  protected:
    Retrieval() {
        setenv("no_proxy", "*", 1);
        identity_.AddCertificateTo(caFile_);
        context_.caFile = caFile_.c_str();
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
    template <class Call>
    auto Stopped(Call call, const std::function<void()>& comesSoFar) {
        auto answer = std::async(std::launch::async, call);
        comesSoFar();
        eventfd_write(context_.stopFd, 1);
        answer.wait();
        eventfd_t count = 0;
        eventfd_read(context_.stopFd, &count);
        return answer.get();
    }
    void ExpectCancelled(const std::string& host, const std::function<void()>& comesSoFar,
                         const std::string& last = "") {
        EXPECT_EQ(Stopped([&] { return Ask(host); }, comesSoFar), QuoteCancelled);
        ExpectLogsEnd(last + "cancelled\n");
    }

    TlsIdentity identity_;
    std::string caFile_ = folder_.File("ca.pem");
};

const std::string Page = "HTTP/1.0 200 OK\r\n\r\n<td>Last</td><td><b>45 3/8</b></td>";
const std::string Asked = "In GetQuote\n";
const std::string Created = Asked + "gethostname() ok\nsocket created ok\n";

TEST_F(Retrieval, AsksByABareRequestAndLogsEveryStep) {
    const std::string request = "GET /q?s=ABC HTTP/1.0\n\n";
    const std::string found = "found tag\nskipped ok\nvalue string is '", start(1022, 'x');
    const std::tuple<Reply, std::string, float> cases[] = {
        {{{Page}, End::Hold}, found + "45'\nReturning price = 45.38\nPrice = 45.38\n", 45.375F},
        // Of each receive of 1024 bytes for itself.
        {{{start + "Last>>>7 Last>>>8"}}, found + "8'\nReturning price = 8.00\nPrice = 8.00\n", 8},
        {{}, "received zero bytes\nReturning price = -4.00\n", NoQuote},
        {{{}, End::Reset}, "recv() error\nReturning price = -4.00\n", NoQuote},
    };
    const std::string asked = "/q?s=ABC'\n" + Created + "connected ok\n" + request;
    for (const auto& [reply, log, price] : cases) {
        LoopbackServer server(reply);
        EXPECT_EQ(Ask(server.Host()), price) << log;
        EXPECT_EQ(Log(), ("Checking '" + server.Host()).append(asked) + log);
        EXPECT_EQ(server.Requests(), std::vector{request});
    }
}

TEST_F(Retrieval, ScansAPageBehindTlsInOnePiece) {
    const std::size_t half = Page.find("st</td>");
    TlsServer server(identity_, [&](const std::string&) {
        return Reply{{Page.substr(0, half), Page.substr(half)}};
    });
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
    const std::tuple<int, Reply, std::string, float> cases[] = {
        // after so many redirects
        {5, {{Page}}, "value string is '45'\n", 45.375F},
        {6, {{Page}}, "https error: Maximum (5) redirects followed\n", NoQuote},
        {0, Redirect("http://" + plain.Host()), "https error: Protocol \"http\" not supported", NoQuote},
        {0, {{"HTTP/1.0 404 Not Found\r\n\r\n" + Page}}, "value string is '45'\n", 45.375F},
        {0, {{Page, std::string(100'000, 'x')}, End::Endless}, "the page has more than 10 MB\n", 45.375F},
        {0, {}, "https error: ", NoQuote},
        {0, {{Page.substr(0, 30)}, End::Reset}, "https error: ", NoQuote},
        {0, {{"HTTP/1.0 200 OK\r\nContent-Length: 999\r\n\r\n" + Page}}, "https error: ", 45.375F},
    };
    for (auto [redirects, reply, log, price] : cases) {
        TlsServer server(identity_, [&left = redirects, &then = reply](const std::string&) {
            return left-- > 0 ? Redirect("/") : then;
        });
        EXPECT_EQ(Ask(server.Host()), price) << log;
        const std::string found = Log();
        EXPECT_NE(found.find(log), found.npos) << found;
    }
    EXPECT_TRUE(plain.Requests().empty());
}

TEST_F(Retrieval, SaysWhyThereIsNoConnection) {
    TlsServer unknown(TlsIdentity(), [](const std::string&) { return Reply{{Page}}; });
    std::string otherName;
    TlsServer redirecting(identity_, [&](const std::string&) { return Redirect(otherName); });
    otherName = "https://localhost:" + std::to_string(redirecting.Port());
    struct : QuoteObserver {
        void CertificateRefused(const char* host) override { refused = host; }
        std::string refused;
    } observer;
    context_.observer = &observer;
    const LoopbackSocket refusing;
    const std::tuple<std::string, std::string, float> cases[] = {
        {refusing.Host(), Created + "connect() error\n", QuoteNetworkFailure},
        {NoSuchHost, Asked + "gethostbyname() error\n", NoQuote},
        {"h:port", "'h:port': the host is none of NAME, NAME:PORT and https://NAME[:PORT]\n", NoQuote},
        {unknown.Host(), "https error: SSL certificate problem", QuoteNetworkFailure},
        {"https://" + refusing.Host(), Asked + "https error: Failed to connect", QuoteNetworkFailure},
        {"https://"s + NoSuchHost, Asked + "https error: Could not resolve host", NoQuote},
        {redirecting.Host(), "no alternative certificate subject name matches", QuoteNetworkFailure},
    };
    for (const auto& [host, log, result] : cases) {
        EXPECT_EQ(Ask(host), result) << host;
        ExpectLogsEnd(log);
    }
    EXPECT_EQ(observer.refused, "localhost");
    EXPECT_EQ(unknown.Requests().size() + redirecting.Requests().size(), 1U);
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
    for (const auto& [lines, price, requests] : cases) {
        const std::size_t before = server.Requests().size();
        EXPECT_EQ(Quote(lines), price) << lines;
        EXPECT_EQ(server.Requests().size() - before, requests) << lines;
    }
    EXPECT_EQ(Quote(comment), NoQuote);
    EXPECT_EQ(Log(), "no source to ask\n");
    context_.sourcePath = "/nowhere/Quorvan.cfg";
    EXPECT_EQ(GetPriceQuote("ABC", context_), NoQuoteSources);
    EXPECT_EQ(Log(), "Unable to open '/nowhere/Quorvan.cfg'\n");
}

TEST_F(Retrieval, StopsAtOnceWhereverItIs) {
    LoopbackServer silent(Reply{{}, End::Hold}), endless(Reply{{"x"}, End::Endless});
    TlsServer tls(identity_, [](const std::string&) { return Reply{{}, End::Hold}; });
    // They serve one at a time: a connection must have ended for the next to be taken.
    for (const std::size_t times : {1, 2}) {
        for (const LoopbackServer* server : {&silent, &endless})
            ExpectCancelled(
                server->Host(), [&] { EXPECT_TRUE(server->WaitFor(times)); });
        ExpectCancelled(tls.Host(), [&] { EXPECT_TRUE(tls.WaitFor(times)); });
    }
    // A server that accepts nobody: one waits for its greeting, and leaves no place in the queue.
    const LoopbackSocket deaf;
    listen(deaf.Fd(), 0);
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

TEST_F(Retrieval, LooksANameUpUntilItIsStopped) {
    for (const int stopFd : {-1, context_.stopFd})
        for (const auto& [name, there] :
             {std::pair{"localhost", true}, {"127.0.0.1", true}, {NoSuchHost, false}, {"", false}})
            EXPECT_EQ(IsConnected(name, stopFd), there) << name;
    static std::binary_semaphore resolving(0), never(0);
    const NameResolver slow = [](const char*, in_addr*) {
        resolving.release();
        never.acquire(); // the program ends before
        return false;
    };
    in_addr address{};
    const auto lookUp = [&] { return LookUpHost("localhost", context_.stopFd, &address, slow); };
    EXPECT_EQ(Stopped(lookUp, [] { resolving.acquire(); }), HostLookup::Stopped);
}

} // namespace
