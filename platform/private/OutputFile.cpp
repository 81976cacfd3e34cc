#include "platform/private/OutputFile.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <filesystem>

#include <QFile>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr qint64 TailSize = 64;

// The toolkit tells of no failed write. A PDF file ends with the place of its table of contents, which is
// found there only when every byte before it was written.
bool IsWholePdf(QFile& file) {
    if (!file.open(QIODevice::ReadOnly) || !file.seek(std::max<qint64>(file.size() - TailSize, 0)))
        return false;
    const QByteArray tail = file.readAll();
    const qsizetype place = tail.lastIndexOf("startxref\n");
    if (place < 0 || !tail.trimmed().endsWith("%%EOF"))
        return false;
    return file.seek(std::atoll(tail.constData() + place + 10)) && file.read(4) == "xref";
}

// Flushes to the disk, so that not even a power failure leaves an empty file in the old one's place.
bool Flush(const std::string& path) {
    const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    const bool flushed = file >= 0 && fsync(file) == 0;
    return file >= 0 && close(file) == 0 && flushed;
}

} // namespace

bool OutputFile::Begin(const std::string& path) {
    Drop();
    std::error_code missing;
    const std::filesystem::path target = std::filesystem::canonical(path, missing);
    path_ = missing ? path : target.string();
    struct stat status {};
    const bool exists = stat(path_.c_str(), &status) == 0;
    if (exists && access(path_.c_str(), W_OK) != 0)
        return false;
    if (exists && S_ISDIR(status.st_mode)) {
        errno = EISDIR;
        return false;
    }
    if (exists && !S_ISREG(status.st_mode))
        return true;
    const std::filesystem::path wanted(path_);
    if (!MakeTemporary((wanted.parent_path() / wanted.stem()).string(), wanted.extension().string()))
        return false;
    return !exists || chmod(temporary_.c_str(), status.st_mode & 07777) == 0;
}

bool OutputFile::MakeTemporary(const std::string& folderAndStem, const std::string& extension) {
    constexpr int attempts = 100;
    const std::string begin = folderAndStem + "." + std::to_string(getpid());
    for (int i = 0; i < attempts; ++i) {
        std::string name = begin;
        name.append("-").append(std::to_string(i)).append(extension);
        const int file = open(name.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
        if (file >= 0) {
            temporary_ = name;
            close(file);
            return true;
        }
        if (errno != EEXIST)
            return false;
    }
    return false;
}

bool OutputFile::Commit() {
    if (temporary_.empty())
        return true;
    QFile file(QString::fromStdString(temporary_));
    const bool whole = IsWholePdf(file);
    if (whole && Flush(temporary_) && std::rename(temporary_.c_str(), path_.c_str()) == 0) {
        temporary_.clear();
        return true;
    }
    const int reason = whole ? errno : EIO;
    Drop();
    errno = reason;
    return false;
}

void OutputFile::Drop() {
    if (!temporary_.empty())
        unlink(temporary_.c_str());
    temporary_.clear();
}
