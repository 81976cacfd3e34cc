#pragma once

#include <chrono>
#include <cstdint>

#include "quotes/LastConnection.h"

struct HostField;
struct QuoteContext;
class QuoteReport;
class QuoteScanner;

// One bare HTTP/1.0 request to a quote server: connects to the host's first IPv4 address, sends the request
// line and nothing else, and gives each receive of at most 1024 bytes to the scanner, until that has a price
// or the server is done. There is no time limit, but the context's stop descriptor ends every wait at once.
// It does not follow redirects and does not look at the answer's header: the scanner sees all bytes.
// A local object of the look-up; what it is given is borrowed.
class PlainExchange {
  public:
    PlainExchange(const QuoteContext& context, QuoteReport& report);
    PlainExchange(const PlainExchange&) = delete;
    PlainExchange& operator=(const PlainExchange&) = delete;
    ~PlainExchange();

    // Asks for the page at `path`. The scanner's price once the request was sent, otherwise the status that
    // says why not; QuoteCancelled as soon as the caller shall stop.
    [[nodiscard]] float Ask(const HostField& host, const char* path, QuoteScanner& scanner);

  private:
    enum class Step { Done, Failed, Stopped };

    [[nodiscard]] Step LookUp(const char* host);
    [[nodiscard]] Step Connect(std::uint16_t port);
    [[nodiscard]] Step Send(const char* path);
    // Failed when the page ended without a price.
    [[nodiscard]] Step Receive(QuoteScanner& scanner);
    // For a look-up that was stopped: no other will follow.
    [[nodiscard]] float EndConnection();
    Step Fail(const char* line);
    void ExpectALongWait();
    // Waits for poll events. False when the caller shall stop.
    [[nodiscard]] bool Wait(short events);
    // For a server that always has something to say, so that nothing is ever waited for.
    [[nodiscard]] bool IsStoppedMeanwhile();
    void ReportConnection(std::uint16_t port) const;

    const QuoteContext& context_;
    QuoteReport& report_;
    LastConnection ownLastConnection_; // for a caller that has none
    LastConnection& lastConnection_;
    std::uint32_t address_ = 0; // in network order
    int socket_ = -1;
    std::chrono::steady_clock::time_point lastLook_; // at the stop descriptor
};
