#include "quotes/PlainExchange.h"

#include <arpa/inet.h>
#include <cerrno>
#include <cstring>
#include <netinet/in.h>
#include <poll.h>
#include <string_view>
#include <sys/socket.h>
#include <unistd.h>

#include "quotes/HostField.h"
#include "quotes/HostLookup.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteScanner.h"
#include "quotes/StopSignal.h"
#include "util/CharacterBuffer.h"

namespace {

constexpr std::size_t BufferSize = 1024; // of the request and of each receive
constexpr int ShortWait = 10;            // milliseconds; a longer wait is worth the time to write the log

bool MustWait() {
    return errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR;
}

} // namespace

PlainExchange::~PlainExchange() {
    if (socket_ >= 0)
        close(socket_);
}

float PlainExchange::Ask(const HostField& host, const char* path, QuoteScanner& scanner) {
    Step step = LookUp(host.name.c_str());
    if (step == Step::Failed)
        return NoQuote;
    if (step == Step::Done)
        step = Connect(host.port);
    if (step == Step::Done)
        step = Send(path);
    if (step == Step::Failed)
        return QuoteNetworkFailure;
    if (step == Step::Done)
        step = Receive(scanner);
    if (step == Step::Stopped)
        return QuoteCancelled;
    report_.LogNumber("Returning price = ", scanner.Price());
    return scanner.Price();
}

PlainExchange::Step PlainExchange::Fail(const char* line) {
    const std::string reason = errno != 0 ? std::strerror(errno) : "the name does not resolve";
    report_.Log("%s\n", line);
    report_.Observer().Failed((std::string(line) + ": " + reason).c_str());
    return Step::Failed;
}

bool PlainExchange::Wait(short events) {
    Waited waited = WaitUnlessStopped(socket_, events, context_.stopFd, ShortWait);
    if (waited == Waited::NotYet) {
        report_.Flush();
        waited = WaitUnlessStopped(socket_, events, context_.stopFd);
    }
    return waited != Waited::Stopped;
}

PlainExchange::Step PlainExchange::LookUp(const char* host) {
    in_addr address{};
    HostLookup result = HostLookup::Found;
    if (!ReadNumericAddress(host, &address)) {
        report_.Flush();
        result = LookUpHost(host, context_.stopFd, &address);
    }
    if (result == HostLookup::Stopped)
        return Step::Stopped;
    if (result == HostLookup::NotFound) {
        errno = 0;
        return Fail("gethostbyname() error");
    }
    address_ = address.s_addr;
    report_.Log("gethostname() ok\n");
    return Step::Done;
}

PlainExchange::Step PlainExchange::Connect(std::uint16_t port) {
    socket_ = socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
    if (socket_ < 0)
        return Fail("socket() error");
    report_.Log("socket created ok\n");
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
    report_.Log("connected ok\n");
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
    report_.LogWhole(request);
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
        if (!Wait(POLLIN))
            return Step::Stopped;
        const ssize_t received = recv(socket_, buffer, sizeof buffer, 0);
        if (received < 0 && MustWait())
            continue;
        if (received < 0)
            return Fail("recv() error");
        if (received == 0) {
            report_.Log("received zero bytes\n");
            return Step::Failed;
        }
        const std::string_view piece(buffer, static_cast<std::size_t>(received));
        report_.Observer().PieceReceived(piece);
        if (scanner.Scan(piece))
            return Step::Done;
    }
}
