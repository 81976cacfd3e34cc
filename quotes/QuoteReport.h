#pragma once

#include <string_view>

#include "quotes/QuoteObserver.h"

class GatheredLog;

// Where a look-up says what it does: the debug log, and the observer if there is one. A local object of the
// look-up, and of its thread.
class QuoteReport {
  public:
    // Null for no log, and for no observer. Both are borrowed.
    QuoteReport(GatheredLog* log, QuoteObserver* observer);
    QuoteReport(const QuoteReport&) = delete;
    QuoteReport& operator=(const QuoteReport&) = delete;

    // Adds one line to the log, formatted as printf does. A line of more than 127 bytes is cut, and keeps its
    // line feed. Not for floating-point conversions (see FormatFixed).
    void Log(const char* format, ...) __attribute__((format(printf, 2, 3)));
    // Adds a line of the text and the value with two decimals.
    void LogNumber(const char* text, float value);
    // Adds the text to the log as it is.
    void LogText(std::string_view text);
    // Writes the log. To be called before every wait that may be a long one.
    void Flush();

    // The caller's observer, or one that does nothing.
    [[nodiscard]] QuoteObserver& Observer() const { return *observer_; }

  private:
    GatheredLog* log_;
    QuoteObserver* observer_;
};
