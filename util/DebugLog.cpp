#include "util/DebugLog.h"

#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace {

int Open(const char* logPath, int mode) {
    // Never waits for a reader, should the path name a pipe.
    return open(logPath, O_WRONLY | O_CREAT | O_CLOEXEC | O_NONBLOCK | mode, 0666);
}

} // namespace

void PrintDebugStatement(const char* text, const char* logPath) {
    if (std::strcmp(text, "CLEAR") != 0)
        DebugLog(logPath).Write(text);
    else if (const int file = Open(logPath, O_TRUNC); file >= 0)
        close(file);
}

DebugLog::~DebugLog() {
    if (file_ >= 0)
        close(file_);
}

void DebugLog::Write(const char* text) {
    if (logPath_)
        file_ = Open(logPath_, O_APPEND);
    logPath_ = nullptr;
    // A log that cannot take the text loses it: there is nobody to tell.
    if (file_ >= 0)
        (void)!write(file_, text, std::strlen(text));
}
