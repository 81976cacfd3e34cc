#pragma once

#include <atomic>
#include <map>
#include <string>

#include "quotes/LoopbackServer.h"

// A web server on loopback with a page for each ticker of an investment file: some prices have risen since,
// some have fallen, some are as they were. It stops in the middle of its work until it is told to go on, and
// has no price for the ticker it stopped at. Its own thread answers; everything else is the maker's.
class QuoteServer {
  public:
    explicit QuoteServer(const std::string& investmentFile);

    // A line of the quote-source file that leads here.
    [[nodiscard]] std::string SourceLine() const;
    // What the page says; 0 without a page.
    [[nodiscard]] float PriceOf(const std::string& ticker) const;
    // The ticker at which it has stopped; empty before.
    [[nodiscard]] std::string HeldTicker() const { return holding_ ? heldTicker_ : ""; }
    void Release() { server_.Release(); }

  private:
    [[nodiscard]] Reply Answer(const std::string& request);

    std::map<std::string, float> prices_;
    std::atomic<int> answered_ = 0;
    std::string heldTicker_; // not touched any more once holding_ is set
    std::atomic<bool> holding_ = false;
    LoopbackServer server_;
};
