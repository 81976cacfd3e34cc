#pragma once

#include <cstddef>
#include <string>
#include <string_view>

struct QuoteSource;

// Is told, step by step, what a look-up of a price does and finds, for whoever wants to show it to a person.
// It decides nothing. The caller of the look-up owns it; every call comes on the thread of the look-up, and
// what is passed is borrowed for that call alone. Page text is as the server sent it: any bytes.
class QuoteObserver {
  public:
    virtual ~QuoteObserver() = default;

    // A source is about to be asked; its path ends with the ticker.
    virtual void SourceTried(const QuoteSource& /*source*/) {}
    // A line of the source file cannot be used; lines count from 1.
    virtual void SourceSkipped(int /*line*/, const char* /*reason*/) {}
    // What follows this line of the source file, which is too short for a source, is not read.
    virtual void ListEnded(int /*line*/) {}
    // There is a connection to this server, named by address and port.
    virtual void Connected(const char* /*server*/) {}
    // The exchange ended without a whole page for the reason given.
    virtual void Failed(const char* /*reason*/) {}
    // Failed was because the host, which is this source's or one that it redirects to, showed no certificate
    // that is trusted here for its name.
    virtual void CertificateRefused(const char* /*host*/) {}
    // A piece of the page arrived.
    virtual void PieceReceived(std::string_view /*piece*/) {}
    // The marker stands at `position` of `piece`.
    virtual void MarkerFound(std::string_view /*piece*/, std::size_t /*position*/) {}
    // The price text, the page text from behind it to the end of the piece, and what the two were read as. A
    // fraction below 0 is malformed.
    virtual void PriceRead(std::string_view /*token*/, std::string_view /*following*/, double /*price*/,
                           double /*fraction*/) {}
    // The source was asked, and this is its answer: a price or a status.
    virtual void SourceAnswered(float /*result*/) {}
};

// Remembers whether the source asked last was one that cannot be trusted.
class RefusalObserver : public QuoteObserver {
  public:
    void SourceTried(const QuoteSource& /*source*/) override { refusedHost_.clear(); }
    void CertificateRefused(const char* host) override { refusedHost_ = host; }

    // Whose certificate was refused; empty for nobody's.
    [[nodiscard]] const std::string& RefusedHost() const { return refusedHost_; }

  private:
    std::string refusedHost_;
};

// Where a look-up, or a run of them, says what it does: the debug log, and the observer if there is one. A
// local object, or a member, of whoever has something to say, and used on its thread.
class QuoteReport {
  public:
    // Null for no log, and for no observer. Both are borrowed.
    QuoteReport(const char* logPath, QuoteObserver* observer);
    QuoteReport(const QuoteReport&) = delete;
    QuoteReport& operator=(const QuoteReport&) = delete;

    // Adds one line to the log. A line of more than 127 bytes is cut, and keeps its line feed.
    void Log(std::string line);
    // Adds a line of the text and the value with two decimals.
    void LogNumber(const char* text, float value);
    // Adds the text to the log as it is.
    void LogText(const char* text);

    // The caller's observer, or one that does nothing.
    [[nodiscard]] QuoteObserver& Observer() const { return *observer_; }

  private:
    const char* logPath_;
    QuoteObserver* observer_;
};
