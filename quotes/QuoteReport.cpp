#include "quotes/QuoteReport.h"

#include "util/CharacterBuffer.h"
#include "util/File.h"
#include "util/Numbers.h"

namespace {

constexpr std::size_t LongestLine = 127;

QuoteObserver gNobody; // which does nothing

} // namespace

QuoteReport::QuoteReport(const char* logPath, QuoteObserver* observer)
    : logPath_(logPath), observer_(observer ? observer : &gNobody) {}

void QuoteReport::Log(std::string line) {
    // What is cut off must not take the line's end along: the next line would run into it.
    if (line.size() > LongestLine)
        line = std::string(CutToBytes(line, LongestLine - 1)) + "\n";
    LogText(line.c_str());
}

void QuoteReport::LogNumber(const char* text, float value) {
    char number[64];
    FormatFixed(static_cast<double>(value), number, sizeof number, 2);
    Log(std::string(text) + number + "\n");
}

void QuoteReport::LogText(const char* text) {
    if (logPath_)
        PrintDebugStatement(text, logPath_);
}
