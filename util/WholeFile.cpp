#include "util/WholeFile.h"

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// An open file that is closed on every path.
class Handle {
  public:
    explicit Handle(int file) : file_(file) {}
    Handle(const Handle&) = delete;
    Handle& operator=(const Handle&) = delete;
    ~Handle() { (void)Close(); }

    [[nodiscard]] int Get() const { return file_; }
    [[nodiscard]] bool Close() {
        const int file = file_;
        file_ = -1;
        return file < 0 || close(file) == 0;
    }

  private:
    int file_;
};

bool WriteAll(int file, std::string_view content) {
    while (!content.empty()) {
        const ssize_t written = write(file, content.data(), content.size());
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0)
            return false;
        content.remove_prefix(static_cast<std::size_t>(written));
    }
    return true;
}

bool WriteNewFile(const std::string& path, std::string_view content, mode_t mode) {
    Handle file(open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
    return file.Get() >= 0 && WriteAll(file.Get(), content) && fchmod(file.Get(), mode) == 0 &&
           fsync(file.Get()) == 0 && file.Close();
}

} // namespace

bool ReadWholeFile(const std::string& path, std::string& content, std::size_t maxBytes) {
    content.clear();
    const Handle file(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    struct stat status {};
    if (file.Get() < 0 || fstat(file.Get(), &status) != 0)
        return false;
    if (!S_ISREG(status.st_mode)) {
        errno = EINVAL;
        return false;
    }
    char buffer[4096];
    for (;;) {
        const ssize_t count = read(file.Get(), buffer, sizeof buffer);
        if (count == 0)
            return true;
        if (count > 0 && content.size() + static_cast<std::size_t>(count) <= maxBytes) {
            content.append(buffer, static_cast<std::size_t>(count));
        } else if (count > 0 || errno != EINTR) {
            content.clear();
            errno = count > 0 ? EFBIG : errno;
            return false;
        }
    }
}

bool WriteWholeFile(const std::string& path, const std::string& temporaryPath, std::string_view content,
                    mode_t mode, ExistingFile existing) {
    if (unlink(temporaryPath.c_str()) != 0 && errno != ENOENT)
        return false;
    const bool moved =
        WriteNewFile(temporaryPath, content, mode) &&
        (existing == ExistingFile::Replace ? std::rename(temporaryPath.c_str(), path.c_str()) == 0
                                           : MoveWithoutReplacing(temporaryPath, path));
    if (!moved) {
        const int reason = errno;
        unlink(temporaryPath.c_str());
        errno = reason;
    }
    return moved;
}

bool MoveWithoutReplacing(const std::string& from, const std::string& to) {
    if (renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0)
        return true;
    // Not every file system knows that call; a second name for the file does not replace either.
    if (errno != EINVAL && errno != ENOSYS)
        return false;
    return link(from.c_str(), to.c_str()) == 0 && unlink(from.c_str()) == 0;
}
