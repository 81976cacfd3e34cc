#pragma once

#include <string>

#include "quotes/QuoteObserver.h"

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
