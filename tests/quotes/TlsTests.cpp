#include <gtest/gtest.h>

#include <cstdlib>
#include <future>
#include <poll.h>
#include <string>

#include "LoopbackServer.h"
#include "QuoteTest.h"
#include "TlsServer.h"

namespace {

const std::string Header = "HTTP/1.0 200 OK\r\n\r\n";
const std::string Page = Header + "<td>Last</td><td><b>45 3/8</b></td>";

Reply Redirect(const std::string& address) {
    return {{"HTTP/1.0 302 Found\r\nLocation: " + address + "\r\nContent-Length: 0\r\n\r\n"}};
}

class Tls : public QuoteTest {
  protected:
    Tls() {
        setenv("no_proxy", "*", 1);
        identity_.WriteCertificate(caFile_);
        context_.caFile = caFile_.c_str();
    }

    float Quote(const std::string& host, const char* path = "/q?s=ABC") {
        return GetQuote(host.c_str(), path, "Last", 3, context_);
    }
    void ExpectFailure(const std::string& host, float result, const char* logged) {
        EXPECT_EQ(Quote(host), result) << host;
        const std::string log = Log();
        EXPECT_NE(log.find(logged), std::string::npos) << log;
    }

    std::string caFile_ = folder_.File("ca.pem");
    TlsIdentity identity_{"IP:127.0.0.1"};
};

TEST_F(Tls, APageIsScannedInOnePiece) {
    TlsServer server(identity_, [&](const std::string&) { return Reply{SingleBytes(Page)}; });
    EXPECT_EQ(Quote(server.Host(), "q?s=B C#\xC3\xA4%20\n"), 45.375F);
    EXPECT_TRUE(server.Requests().at(0).starts_with("GET /q?s=B%20C%23%C3%A4%20%0A HTTP/1.1\r\n"));
    EXPECT_EQ(Log(), "In GetQuote\nconnected to 127.0.0.1 port " + std::to_string(server.Port()) +
                         "\nreceived 35 bytes\nfound tag\nskipped ok\nvalue string is '45'\n"
                         "Returning price = 45.38\n");
}

TEST_F(Tls, OnceAskedTheServersAnswerCountsWhateverItsEnd) {
    LoopbackServer plain(Reply{{Page}});
    std::size_t redirects = 0;
    TlsServer server(identity_, [&](const std::string& request) {
        const auto asks = [&](const char* path) {
            return request.starts_with(std::string("GET ") + path + " ");
        };
        if (asks("/down"))
            return Redirect("http://" + plain.Host() + "/");
        if (asks("/around") && redirects-- > 0)
            return Redirect("/around");
        if (asks("/missing"))
            return Reply{{"HTTP/1.0 404 Not Found\r\n\r\n" + Page}};
        if (asks("/large"))
            return Reply{{Page, std::string(100'000, 'x')}, Reply::End::Endless};
        if (asks("/silent"))
            return Reply{};
        if (asks("/reset"))
            return Reply{{Page.substr(0, 30)}, Reply::End::Reset};
        if (asks("/short"))
            return Reply{{"HTTP/1.0 200 OK\r\nContent-Length: 999\r\n\r\n" + Page}};
        return Reply{{Page}};
    });
    const struct {
        const char* path;
        std::size_t redirects;
        float price;
        const char* log;
    } cases[] = {
        {"/around", 5, 45.375F, "value string is '45'\n"},
        {"/around", 6, NoQuote, "https error: Maximum (5) redirects followed\n"},
        {"/down", 0, NoQuote, "https error: Protocol \"http\" not supported"},
        {"/missing", 0, NoQuote, "https error: The requested URL returned error: 404\n"},
        {"/large", 0, 45.375F, "https error: the page has more than 10 MB\n"},
        {"/silent", 0, NoQuote, "https error: "},
        {"/reset", 0, NoQuote, "https error: "},
        {"/short", 0, 45.375F, "https error: "},
    };
    for (const auto& c : cases) {
        redirects = c.redirects;
        EXPECT_EQ(Quote(server.Host(), c.path), c.price) << c.path;
        const std::string log = Log();
        EXPECT_NE(log.find(c.log), std::string::npos) << log;
    }
    EXPECT_TRUE(plain.Requests().empty());
}

TEST_F(Tls, AConnectionThatCannotBeTrustedIsAFailure) {
    const auto answer = [](const std::string&) { return Reply{{Page}}; };
    const TlsIdentity stranger("IP:127.0.0.1");
    const TlsIdentity otherName("DNS:quotes.example");
    TlsServer unknown(stranger, answer);
    ExpectFailure(unknown.Host(), QuoteNetworkFailure, "https error: SSL certificate problem");
    TlsServer misnamed(otherName, answer);
    otherName.WriteCertificate(caFile_);
    ExpectFailure(misnamed.Host(), QuoteNetworkFailure, "no alternative certificate subject name matches");
    EXPECT_TRUE(unknown.Requests().empty() && misnamed.Requests().empty());
}

TEST_F(Tls, NoConnectionIsAFailureAndNoNameIsNoPrice) {
    const LoopbackSocket refusing;
    ExpectFailure("https://" + refusing.Host(), QuoteNetworkFailure, "https error: Failed to connect");
    ExpectFailure("https://no..such..host", NoQuote, "https error: Could not resolve host");
}

TEST_F(Tls, StopsAtOnceWhereverTheServerIs) {
    for (const Reply& reply : {Reply{{}, Reply::End::Hold}, Reply{{Page}, Reply::End::Hold}}) {
        TlsServer server(identity_, [&](const std::string&) { return reply; });
        const StopSwitch stop;
        context_.stopFd = stop.Fd();
        auto quote = std::async(std::launch::async, [&] { return Quote(server.Host()); });
        EXPECT_TRUE(server.WaitForRequests(1));
        stop.Stop();
        EXPECT_EQ(quote.get(), QuoteCancelled);
        EXPECT_TRUE(server.WaitForEnds(1));
    }
    // A server that never answers the first greeting.
    context_.stopFd = stop_.Fd();
    const LoopbackSocket silent;
    ASSERT_EQ(listen(silent.Fd(), 1), 0);
    auto quote = std::async(std::launch::async, [&] { return Quote("https://" + silent.Host()); });
    pollfd connection{silent.Fd(), POLLIN, 0};
    EXPECT_EQ(poll(&connection, 1, 10'000), 1);
    stop_.Stop();
    EXPECT_EQ(quote.get(), QuoteCancelled);
}

} // namespace
