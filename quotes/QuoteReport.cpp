#include "quotes/QuoteReport.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

#include "util/CharacterBuffer.h"
#include "util/DebugLog.h"
#include "util/Numbers.h"

namespace {

constexpr std::size_t LogLineSize = 128;

QuoteObserver* Nobody() {
    static QuoteObserver nobody;
    return &nobody;
}

} // namespace

QuoteReport::QuoteReport(const char* logPath, QuoteObserver* observer)
    : logPath_(logPath), observer_(observer ? observer : Nobody()) {}

void QuoteReport::Log(const char* format, ...) {
    char formatted[LogLineSize];
    va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(formatted, sizeof formatted, format, arguments);
    va_end(arguments);
    if (length < static_cast<int>(sizeof formatted)) {
        LogWhole(formatted);
        return;
    }
    // What was cut off must not take the line's end along: the next line would run into it.
    char line[LogLineSize];
    CopyText(line, LogLineSize - 1, formatted);
    std::strcat(line, "\n");
    LogWhole(line);
}

void QuoteReport::LogNumber(const char* text, float value) {
    char number[64];
    FormatFixed(static_cast<double>(value), number, sizeof number, 2);
    Log("%s%s\n", text, number);
}

void QuoteReport::LogWhole(const char* text) {
    if (logPath_)
        unwritten_ += text;
}

void QuoteReport::Flush() {
    if (!unwritten_.empty())
        PrintDebugStatement(unwritten_.c_str(), logPath_);
    unwritten_.clear();
}
