#pragma once

#include <string>

#include "quotes/QuoteObserver.h"
#include "util/DebugLog.h"

// Where a look-up says what it does: the debug log, and the observer if there is one. A local object of the
// look-up, and of its thread.
//
// Lines for the log are gathered and written together: before the look-up waits for anything (see Flush) and
// at the end. Opening and writing the log for each line took half as long as a request to a near server; this
// way nearly all of it is done while the server thinks.
class QuoteReport {
  public:
    // Null for no log, and for no observer. Both are borrowed.
    QuoteReport(const char* logPath, QuoteObserver* observer);
    QuoteReport(QuoteReport&) = delete;
    QuoteReport& operator=(QuoteReport&) = delete;
    ~QuoteReport() { Flush(); }

    // Adds one line to the log, formatted as printf does. A line of more than 127 bytes is cut, and keeps its
    // line feed. Not for floating-point conversions (see FormatFixed).
    void Log(const char* format, ...) __attribute__((format(printf, 2, 3)));
    // Adds a line of the text and the value with two decimals.
    void LogNumber(const char* text, float value);
    // Adds the text to the log as it is.
    void LogWhole(const char* text);
    // Writes to the log what has been added since. To be called before every wait, so that the log tells what
    // is being waited for.
    void Flush();

    // The caller's observer, or one that does nothing.
    [[nodiscard]] QuoteObserver& Observer() const { return *observer_; }

  private:
    DebugLog log_;
    std::string unwritten_;
    QuoteObserver* observer_;
};
