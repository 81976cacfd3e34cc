#include "quotes/PlainExchange.h"

#include <arpa/inet.h>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <netinet/in.h>
#include <poll.h>
#include <string_view>
#include <sys/socket.h>
#include <utility>

#include "quotes/HostField.h"
#include "quotes/HostLookup.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteScanner.h"
#include "quotes/StopSignal.h"
#include "util/CharacterBuffer.h"

namespace {

constexpr std::size_t BufferSize = 1024; // of the request and of each receive
// A call on the socket waits no longer; then the stop descriptor is waited for as well, and the wait is worth
// the time to write the log. To poll before every call took a tenth of the time of a request to a near
// server.
constexpr std::chrono::milliseconds ShortWait(10);

bool MustWait() {
    return errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR;
}

bool LimitWaits(int socket) {
    timeval limit{};
    limit.tv_usec = std::chrono::microseconds(ShortWait).count();
    return setsockopt(socket, SOL_SOCKET, SO_RCVTIMEO, &limit, sizeof limit) == 0 &&
           setsockopt(socket, SOL_SOCKET, SO_SNDTIMEO, &limit, sizeof limit) == 0;
}

} // namespace

PlainExchange::PlainExchange(const QuoteContext& context, QuoteReport& report)
    : context_(context),
      report_(report),
      lastConnection_(context.lastConnection ? *context.lastConnection : ownLastConnection_) {}

PlainExchange::~PlainExchange() {
    if (socket_ >= 0)
        lastConnection_.Keep(socket_);
}

float PlainExchange::Ask(const HostField& host, const char* path, QuoteScanner& scanner) {
    Step step = LookUp(host.name.c_str());
    if (step == Step::Failed)
        return NoQuote;
    if (step == Step::Done)
        step = Connect(host.port);
    if (step == Step::Done)
        step = Send(path);
    lastConnection_.Close();
    if (step == Step::Failed)
        return QuoteNetworkFailure;
    if (step == Step::Done)
        step = Receive(scanner);
    if (step == Step::Stopped)
        return EndConnection();
    report_.LogNumber("Returning price = ", scanner.Price());
    return scanner.Price();
}

float PlainExchange::EndConnection() {
    lastConnection_.Keep(std::exchange(socket_, -1));
    lastConnection_.Close();
    return QuoteCancelled;
}

PlainExchange::Step PlainExchange::Fail(const char* line) {
    const std::string reason = errno != 0 ? std::strerror(errno) : "the name does not resolve";
    report_.Log("%s\n", line);
    report_.Observer().Failed((std::string(line) + ": " + reason).c_str());
    return Step::Failed;
}

void PlainExchange::ExpectALongWait() {
    report_.Flush();
    lastConnection_.Close();
}

bool PlainExchange::Wait(short events) {
    ExpectALongWait();
    return WaitUnlessStopped(socket_, events, context_.stopFd) != Waited::Stopped;
}

bool PlainExchange::IsStoppedMeanwhile() {
    const auto now = std::chrono::steady_clock::now();
    if (now - lastLook_ < ShortWait)
        return false;
    lastLook_ = now;
    return IsStopped(context_.stopFd);
}

PlainExchange::Step PlainExchange::LookUp(const char* host) {
    in_addr address{};
    HostLookup result = HostLookup::Found;
    if (!ReadNumericAddress(host, &address)) {
        ExpectALongWait();
        result = LookUpHost(host, context_.stopFd, &address);
    }
    if (result == HostLookup::Stopped)
        return Step::Stopped;
    if (result == HostLookup::NotFound) {
        errno = 0;
        return Fail("gethostbyname() error");
    }
    address_ = address.s_addr;
    report_.LogText("gethostname() ok\n");
    return Step::Done;
}

PlainExchange::Step PlainExchange::Connect(std::uint16_t port) {
    socket_ = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (socket_ < 0 || !LimitWaits(socket_))
        return Fail("socket() error");
    report_.LogText("socket created ok\n");
    sockaddr_in server{};
    server.sin_family = AF_INET;
    server.sin_port = htons(port);
    server.sin_addr.s_addr = address_;
    int error = connect(socket_, reinterpret_cast<const sockaddr*>(&server), sizeof server) == 0 ? 0 : errno;
    if (error == EINPROGRESS || error == EINTR) {
        if (!Wait(POLLOUT))
            return Step::Stopped;
        socklen_t size = sizeof error;
        getsockopt(socket_, SOL_SOCKET, SO_ERROR, &error, &size);
    }
    errno = error;
    if (error != 0)
        return Fail("connect() error");
    report_.LogText("connected ok\n");
    if (context_.observer)
        ReportConnection(port);
    return Step::Done;
}

void PlainExchange::ReportConnection(std::uint16_t port) const {
    char address[INET_ADDRSTRLEN] = "";
    inet_ntop(AF_INET, &address_, address, sizeof address);
    report_.Observer().Connected((std::string(address) + " port " + std::to_string(port)).c_str());
}

PlainExchange::Step PlainExchange::Send(const char* path) {
    char request[BufferSize];
    if (!FormatInto(request, sizeof request, "GET %s HTTP/1.0\n\n", path)) {
        errno = EMSGSIZE;
        return Fail("send() error");
    }
    report_.LogText(request);
    std::string_view rest(request);
    while (!rest.empty()) {
        const ssize_t sent = send(socket_, rest.data(), rest.size(), MSG_NOSIGNAL);
        if (sent >= 0)
            rest.remove_prefix(static_cast<std::size_t>(sent));
        else if (!MustWait())
            return Fail("send() error");
        else if (!Wait(POLLOUT))
            return Step::Stopped;
    }
    return Step::Done;
}

PlainExchange::Step PlainExchange::Receive(QuoteScanner& scanner) {
    char buffer[BufferSize];
    for (;;) {
        const ssize_t received = recv(socket_, buffer, sizeof buffer, 0);
        if (received < 0 && MustWait()) {
            if (!Wait(POLLIN))
                return Step::Stopped;
            continue;
        }
        if (received < 0)
            return Fail("recv() error");
        if (received == 0) {
            report_.LogText("received zero bytes\n");
            return Step::Failed;
        }
        const std::string_view piece(buffer, static_cast<std::size_t>(received));
        report_.Observer().PieceReceived(piece);
        if (scanner.Scan(piece))
            return Step::Done;
        if (IsStoppedMeanwhile())
            return Step::Stopped;
    }
}
