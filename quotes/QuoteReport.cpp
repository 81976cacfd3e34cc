#include "quotes/QuoteReport.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <string>

#include "util/CharacterBuffer.h"
#include "util/GatheredLog.h"
#include "util/Numbers.h"

namespace {

constexpr std::size_t LogLineSize = 128;

QuoteObserver* Nobody() {
    static QuoteObserver nobody;
    return &nobody;
}

} // namespace

QuoteReport::QuoteReport(GatheredLog* log, QuoteObserver* observer)
    : log_(log), observer_(observer ? observer : Nobody()) {}

void QuoteReport::Log(const char* format, ...) {
    char formatted[LogLineSize];
    va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(formatted, sizeof formatted, format, arguments);
    va_end(arguments);
    if (length < static_cast<int>(sizeof formatted)) {
        LogText(formatted);
        return;
    }
    // What was cut off must not take the line's end along: the next line would run into it.
    char line[LogLineSize];
    CopyText(line, LogLineSize - 1, formatted);
    std::strcat(line, "\n");
    LogText(line);
}

void QuoteReport::LogNumber(const char* text, float value) {
    char number[64];
    FormatFixed(static_cast<double>(value), number, sizeof number, 2);
    LogText((std::string(text) + number).append("\n"));
}

void QuoteReport::LogText(std::string_view text) {
    if (log_)
        log_->Add(text);
}

void QuoteReport::Flush() {
    if (log_)
        log_->Write();
}
