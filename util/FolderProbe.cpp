#include "util/FolderProbe.h"

#include <array>
#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <unistd.h>

int TryWritingIn(const std::string& folder) {
    std::string path = folder + "/Quorvan.XXXXXX";
    const int file = mkostemp(path.data(), O_CLOEXEC);
    if (file < 0)
        return errno;
    unlink(path.c_str());
    // About what a day of changes to settings and data files takes.
    const std::array<char, 65536> bytes{};
    const ssize_t written = write(file, bytes.data(), bytes.size());
    int error = 0;
    if (written < 0)
        error = errno;
    else if (written < static_cast<ssize_t>(bytes.size()))
        error = ENOSPC;
    // Some file systems find out only now.
    if (close(file) != 0 && error == 0)
        error = errno;
    return error;
}
