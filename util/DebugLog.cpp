#include "util/DebugLog.h"

#include <cstring>
#include <fcntl.h>
#include <unistd.h>

void PrintDebugStatement(const char* text, const char* logPath) {
    const bool clear = std::strcmp(text, "CLEAR") == 0;
    const int mode = clear ? O_TRUNC : O_APPEND;
    // Never waits for a reader, should the path name a pipe.
    const int file = open(logPath, O_WRONLY | O_CREAT | O_CLOEXEC | O_NONBLOCK | mode, 0600);
    if (file < 0)
        return;
    // A log that cannot take the text loses it: there is nobody to tell.
    if (!clear)
        static_cast<void>(!write(file, text, std::strlen(text)));
    close(file);
}
