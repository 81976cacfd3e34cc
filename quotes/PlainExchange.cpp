#include "quotes/Exchange.h"

#include <arpa/inet.h>
#include <cerrno>
#include <cstring>
#include <netinet/in.h>
#include <poll.h>
#include <string>
#include <sys/socket.h>
#include <unistd.h>

#include "quotes/Host.h"
#include "quotes/QuoteReport.h"
#include "quotes/QuoteRetrieval.h"
#include "quotes/QuoteScanner.h"
#include "util/CharacterBuffer.h"
#include "util/Strings.h"

namespace {

constexpr std::size_t BufferSize = 1024; // of the request and of each receive

// Its socket never blocks: every wait is one for the stop descriptor as well.
class PlainExchange {
  public:
    PlainExchange(const QuoteContext& context, QuoteReport& report) : context_(context), report_(report) {}
    PlainExchange(const PlainExchange&) = delete;
    PlainExchange& operator=(const PlainExchange&) = delete;
    ~PlainExchange() {
        if (socket_ >= 0)
            close(socket_);
    }

    [[nodiscard]] float Ask(const HostField& host, const char* path, QuoteScanner& scanner);

  private:
    // The steps are false when they failed, with the answer in status_, or the caller shall stop.
    [[nodiscard]] bool LookUp(const char* host);
    [[nodiscard]] bool Connect(std::uint16_t port);
    [[nodiscard]] bool Send(const char* path);
    // Until there is a price, or no more of the page.
    [[nodiscard]] bool Receive(QuoteScanner& scanner);
    bool Fail(float status, const char* line, const std::string& reason = Reason(errno));
    [[nodiscard]] bool Wait(short events) const {
        return WaitUnlessStopped(socket_, events, context_.stopFd);
    }

    const QuoteContext& context_;
    QuoteReport& report_;
    in_addr address_{};
    int socket_ = -1;
    float status_ = QuoteCancelled;
};

float PlainExchange::Ask(const HostField& host, const char* path, QuoteScanner& scanner) {
    if (!LookUp(host.name.c_str()) || !Connect(host.port) || !Send(path) || !Receive(scanner))
        return status_;
    report_.LogNumber("Returning price = ", scanner.Price());
    return scanner.Price();
}

bool PlainExchange::Fail(float status, const char* line, const std::string& reason) {
    status_ = status;
    report_.Log(std::string(line) + "\n");
    report_.Observer().Failed((std::string(line) + ": " + reason).c_str());
    return false;
}

bool PlainExchange::LookUp(const char* host) {
    const HostLookup result = LookUpHost(host, context_.stopFd, &address_);
    if (result == HostLookup::NotFound)
        return Fail(NoQuote, "gethostbyname() error", "the name does not resolve");
    if (result == HostLookup::Found)
        report_.LogText("gethostname() ok\n");
    return result == HostLookup::Found;
}

bool PlainExchange::Connect(std::uint16_t port) {
    socket_ = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    if (socket_ < 0)
        return Fail(QuoteNetworkFailure, "socket() error");
    report_.LogText("socket created ok\n");
    sockaddr_in server{};
    server.sin_family = AF_INET;
    server.sin_port = htons(port);
    server.sin_addr = address_;
    int error = connect(socket_, reinterpret_cast<const sockaddr*>(&server), sizeof server) == 0 ? 0 : errno;
    if (error == EINPROGRESS) {
        if (!Wait(POLLOUT))
            return false;
        socklen_t size = sizeof error;
        getsockopt(socket_, SOL_SOCKET, SO_ERROR, &error, &size);
    }
    if (error != 0)
        return Fail(QuoteNetworkFailure, "connect() error", Reason(error));
    report_.LogText("connected ok\n");
    char address[INET_ADDRSTRLEN] = "";
    inet_ntop(AF_INET, &address_, address, sizeof address);
    report_.Observer().Connected((std::string(address) + " port " + std::to_string(port)).c_str());
    return true;
}

bool PlainExchange::Send(const char* path) {
    char request[BufferSize];
    if (!FormatInto(request, sizeof request, "GET %s HTTP/1.0\n\n", path))
        return Fail(QuoteNetworkFailure, "send() error", Reason(EMSGSIZE));
    report_.LogText(request);
    // A new connection takes so little at once.
    const std::size_t length = std::strlen(request);
    if (send(socket_, request, length, MSG_NOSIGNAL) != static_cast<ssize_t>(length))
        return Fail(QuoteNetworkFailure, "send() error");
    return true;
}

bool PlainExchange::Receive(QuoteScanner& scanner) {
    char buffer[BufferSize];
    for (;;) {
        if (!Wait(POLLIN))
            return false;
        const ssize_t received = recv(socket_, buffer, sizeof buffer, 0);
        if (received < 0 && errno == EAGAIN)
            continue;
        if (received < 0)
            Fail(NoQuote, "recv() error");
        else if (received == 0)
            report_.LogText("received zero bytes\n");
        if (received <= 0)
            return true;
        const std::string_view piece(buffer, static_cast<std::size_t>(received));
        report_.Observer().PieceReceived(piece);
        if (scanner.Scan(piece))
            return true;
    }
}

} // namespace

float AskPlainly(const HostField& host, const char* path, QuoteScanner& scanner, const QuoteContext& context,
                 QuoteReport& report) {
    return PlainExchange(context, report).Ask(host, path, scanner);
}
