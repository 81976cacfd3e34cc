#pragma once

#include <string>

#include "quotes/QuoteObserver.h"

// Where a look-up says what it does: the debug log, and the observer if there is one. A local object of the
// look-up, and of its thread.
//
// Lines for the log are gathered and written together: when the look-up has to wait (see Flush) and at the
// end. To open and write the log for each line took half as long as a request to a near server.
class QuoteReport {
  public:
    // Null for no log, and for no observer. Both are borrowed.
    QuoteReport(const char* logPath, QuoteObserver* observer);
    QuoteReport(const QuoteReport&) = delete;
    QuoteReport& operator=(const QuoteReport&) = delete;
    ~QuoteReport() { Flush(); }

    // Adds one line to the log, formatted as printf does. A line of more than 127 bytes is cut, and keeps its
    // line feed. Not for floating-point conversions (see FormatFixed).
    void Log(const char* format, ...) __attribute__((format(printf, 2, 3)));
    // Adds a line of the text and the value with two decimals.
    void LogNumber(const char* text, float value);
    // Adds the text to the log as it is.
    void LogWhole(const char* text);
    // Writes to the log what has been added since. To be called before every wait that may be a long one, so
    // that the log tells what is being waited for.
    void Flush();

    // The caller's observer, or one that does nothing.
    [[nodiscard]] QuoteObserver& Observer() const { return *observer_; }

  private:
    const char* logPath_;
    std::string unwritten_;
    QuoteObserver* observer_;
};
