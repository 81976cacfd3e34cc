#pragma once

#include "quotes/QuoteObserver.h"
#include "util/DebugLog.h"

// Where a look-up says what it does: the debug log, and the observer if there is one. A local object of the
// look-up.
class QuoteReport {
  public:
    // Null for no log, and for no observer. Both are borrowed.
    QuoteReport(const char* logPath, QuoteObserver* observer);

    // Writes one line to the log, formatted as printf does. A line of more than 127 bytes is cut, and keeps
    // its line feed. Not for floating-point conversions (see FormatFixed).
    void Log(const char* format, ...) const __attribute__((format(printf, 2, 3)));
    // Writes a line of the text and the value with two decimals.
    void LogNumber(const char* text, float value) const;
    // Writes the text to the log as it is.
    void LogWhole(const char* text) const;

    // The caller's observer, or one that does nothing.
    [[nodiscard]] QuoteObserver& Observer() const { return *observer_; }

  private:
    DebugLog log_;
    QuoteObserver* observer_;
};
