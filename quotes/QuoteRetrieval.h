#pragma once

#include <cerrno>
#include <limits>
#include <poll.h>
#include <string_view>

class QuoteObserver;

// The look-up of a share's price on the web pages that the quote-source file lists (doc/quote-sources.md). It
// knows no portfolio, shows nothing and keeps nothing between calls; it may be used on any thread. The calls
// wait for the network as long as it takes, unless they are told to stop.

// What a look-up answers instead of a price. A price is above 0. Any other value that is not listed here
// comes from a page whose price text is a number of 0 or less; text that is no number reads as 0.
inline constexpr float QuoteSearchEnded = -2.0F;    // so a page said; no further source is asked
inline constexpr float NoQuoteSources = -3.0F;      // the quote-source file cannot be read
inline constexpr float NoQuote = -4.0F;             // no source knew a price
inline constexpr float QuoteNetworkFailure = -6.0F; // the last source could not be reached
// The call was told to stop; nothing is known about the price. No page can bring this value about.
inline constexpr float QuoteCancelled = -std::numeric_limits<float>::infinity();

// What a look-up works with. Everything is borrowed for the call.
struct QuoteContext {
    const char* sourcePath = "";       // the quote-source file
    const char* logPath = nullptr;     // the debug log; null for none
    int stopFd = -1;                   // once readable, the call returns at once; -1 for never
    const char* caFile = nullptr;      // certificates to trust in place of the system's, as a PEM file
    QuoteObserver* observer = nullptr; // is told what is done and found
};

// The price of the ticker from the first source that knows one, in the file's order, or a status. Every step
// leaves a line in the debug log.
[[nodiscard]] float GetPriceQuote(const char* ticker, const QuoteContext& context);

// As GetPriceQuote, with the lines of a quote-source file in `sources`; the context's path is not used.
[[nodiscard]] float GetPriceQuoteFrom(std::string_view sources, const char* ticker,
                                      const QuoteContext& context);

// Asks one source: fetches the page `path`, which ends with the ticker already, and reads the price behind
// `tag` and `skip` characters ">". `host` is a name that is asked by plain HTTP on port 80, a name with
// ":PORT", or "https://NAME" with or without ":PORT"; for anything else the answer is NoQuote. A plain source
// has no time limit. The request takes at most 1023 bytes.
//
// The price or a status: NoQuote when the name does not resolve, the page has no price, or its number is
// beyond a float; QuoteNetworkFailure when there is no connection or the request cannot be sent.
[[nodiscard]] float GetQuote(const char* host, const char* path, const char* tag, int skip,
                             const QuoteContext& context);

// True when the host name resolves. False also when `stopFd` (-1 for none) becomes readable first.
[[nodiscard]] bool IsConnected(const char* hostName, int stopFd = -1);

// Waiting beside a file descriptor that becomes readable when the caller shall stop (-1 for one that never
// does). A descriptor that is not open counts as readable: nobody could ever say stop with it.

// Waits until `fd` has one of the poll events or an error; false as soon as `stopFd` is readable, which
// counts more.
[[nodiscard]] inline bool WaitUnlessStopped(int fd, short events, int stopFd) {
    pollfd fds[] = {{fd, events, 0}, {stopFd, POLLIN, 0}};
    while (poll(fds, 2, -1) < 0 && errno == EINTR) {
    }
    return fds[1].revents == 0;
}

[[nodiscard]] inline bool IsStopped(int stopFd) {
    pollfd stop{stopFd, POLLIN, 0};
    return stopFd >= 0 && poll(&stop, 1, 0) > 0;
}
