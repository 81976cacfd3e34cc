#include "tools/ProgressLine.h"

#include <unistd.h>

namespace {

constexpr const char* EraseLine = "\r\x1b[K";
constexpr std::chrono::milliseconds Pause(100);

} // namespace

ProgressLine::ProgressLine(int descriptor) : descriptor_(descriptor), shows_(isatty(descriptor) == 1) {}

ProgressLine::~ProgressLine() {
    if (shown_)
        Write(EraseLine);
}

void ProgressLine::Show(const std::string& text) {
    const auto now = std::chrono::steady_clock::now();
    if (!shows_ || now < next_)
        return;
    next_ = now + Pause;
    shown_ = true;
    Write(EraseLine + text);
}

void ProgressLine::Write(const std::string& text) const {
    // A terminal that takes nothing is no reason to stop.
    [[maybe_unused]] const ssize_t written = write(descriptor_, text.data(), text.size());
}
