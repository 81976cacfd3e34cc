#include "tools/ProgressLine.h"

#include <unistd.h>

namespace {

constexpr const char* EraseLine = "\r\x1b[K";

} // namespace

ProgressLine::ProgressLine(int descriptor, std::chrono::milliseconds pause)
    : descriptor_(descriptor), pause_(pause), shows_(isatty(descriptor) == 1) {}

ProgressLine::~ProgressLine() {
    if (shown_)
        Write(EraseLine);
}

void ProgressLine::Show(const std::string& text) {
    const auto now = std::chrono::steady_clock::now();
    if (!shows_ || now < next_)
        return;
    next_ = now + pause_;
    shown_ = true;
    Write(EraseLine + text);
}

void ProgressLine::Write(const std::string& text) const {
    // A terminal that takes nothing is no reason to stop.
    [[maybe_unused]] const ssize_t written = write(descriptor_, text.data(), text.size());
}
