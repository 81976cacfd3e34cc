#include "util/FolderLock.h"

#include <cerrno>
#include <charconv>
#include <csignal>
#include <ctime>
#include <fcntl.h>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

#include "util/CharacterBuffer.h"
#include "util/Utf8.h"

namespace {

constexpr std::size_t MostText = 1024;
constexpr std::size_t MostField = 100;

// Far behind the text, so that where locks hinder reading (network folders do) the text can be read.
struct flock LockRegion() {
    struct flock region {};
    region.l_type = F_WRLCK;
    region.l_whence = SEEK_SET;
    region.l_start = off_t{1} << 30;
    region.l_len = 1;
    return region;
}

std::string HostName() {
    char name[256] = "";
    if (gethostname(name, sizeof name - 1) != 0)
        return {};
    return name;
}

std::string LocalTime() {
    const std::time_t now = std::time(nullptr);
    std::tm parts{};
    char text[32] = "";
    if (localtime_r(&now, &parts) == nullptr ||
        std::strftime(text, sizeof text, "%Y-%m-%d %H:%M:%S", &parts) == 0)
        return {};
    return text;
}

// Anybody may have written the file: what is shown of it is short and in one line.
std::string Shown(std::string_view field) {
    std::string text;
    AppendEscaped(text, CutToBytes(field, MostField));
    return text;
}

// The rest of the line that begins with the key.
std::string_view FieldOf(std::string_view text, std::string_view key) {
    while (!text.empty()) {
        const std::string_view line = text.substr(0, text.find('\n'));
        if (line.starts_with(key))
            return line.substr(key.size());
        text.remove_prefix(line.size() == text.size() ? line.size() : line.size() + 1);
    }
    return {};
}

FolderHolder ReadHolder(int file) {
    char buffer[MostText];
    const ssize_t size = pread(file, buffer, sizeof buffer, 0);
    const std::string_view text(buffer, size > 0 ? static_cast<std::size_t>(size) : 0);
    FolderHolder holder;
    holder.program = Shown(FieldOf(text, "program: "));
    holder.host = Shown(FieldOf(text, "host: "));
    holder.since = Shown(FieldOf(text, "since: "));
    const std::string_view process = FieldOf(text, "process: ");
    std::from_chars(process.data(), process.data() + process.size(), holder.process);
    return holder;
}

bool WriteHolder(int file, const std::string& program) {
    const std::string text = "program: " + program + "\nprocess: " + std::to_string(getpid()) +
                             "\nhost: " + HostName() + "\nsince: " + LocalTime() + "\n";
    // Not emptied first: who reads meanwhile finds a name.
    return pwrite(file, text.data(), text.size(), 0) == static_cast<ssize_t>(text.size()) &&
           ftruncate(file, static_cast<off_t>(text.size())) == 0;
}

bool IsAlive(long process) {
    return process > 0 && (kill(static_cast<pid_t>(process), 0) == 0 || errno == EPERM);
}

bool Names(const std::string& path, int file) {
    struct stat named {};
    struct stat opened {};
    return fstat(file, &opened) == 0 && lstat(path.c_str(), &named) == 0 && named.st_dev == opened.st_dev &&
           named.st_ino == opened.st_ino;
}

// Whoever may make files in the folder may lock it, and whoever may look into it may read who has it,
// whatever the maker's file mode mask.
void ShareWithFolder(int file, const std::string& lockPath) {
    struct stat folder {};
    struct stat own {};
    if (stat(lockPath.substr(0, lockPath.rfind('/') + 1).c_str(), &folder) == 0 && fstat(file, &own) == 0)
        static_cast<void>(fchmod(file, own.st_mode | (folder.st_mode & 0666)));
}

} // namespace

std::string DescribeHolder(const FolderHolder& holder) {
    if (holder.program.empty() || holder.process <= 0)
        return "another program";
    return holder.program + " (process " + std::to_string(holder.process) +
           (holder.host.empty() ? "" : " on the computer " + holder.host) +
           (holder.since.empty() ? "" : ", since " + holder.since) + ")";
}

int FolderLock::LockBySystem(int file) {
    struct flock region = LockRegion();
    while (fcntl(file, F_OFD_SETLK, &region) != 0)
        if (errno != EINTR)
            return errno == EACCES ? EAGAIN : errno;
    return 0;
}

FolderLock::FolderLock(LockCall lockCall) : lockCall_(lockCall) {}

FolderLock::~FolderLock() {
    Release();
}

void FolderLock::Release() {
    if (file_ < 0)
        return;
    // Still locked: nobody else can have taken the file that is removed. In a folder where only the maker may
    // remove it, the empty file stays.
    if (Names(path_, file_) && unlink(path_.c_str()) != 0)
        static_cast<void>(ftruncate(file_, 0));
    close(file_);
    file_ = -1;
}

FolderLock::Outcome FolderLock::Fail(int error) {
    error_ = error;
    return Outcome::Failed;
}

FolderLock::Outcome FolderLock::Take(const std::string& folder, const std::string& program, Doubt doubt) {
    Release();
    holder_ = {};
    error_ = 0;
    path_ = folder + "/" + FileName;
    constexpr int mostTries = 100; // each means that somebody else took and released it in between
    for (int i = 0; i < mostTries; ++i)
        if (const std::optional<Outcome> outcome = TryToTake(program, doubt))
            return *outcome;
    return Outcome::Held;
}

std::optional<FolderLock::Outcome> FolderLock::TryToTake(const std::string& program, Doubt doubt) {
    constexpr int common = O_RDWR | O_NOFOLLOW | O_CLOEXEC | O_NONBLOCK | O_NOCTTY;
    int file = open(path_.c_str(), common | O_CREAT | O_EXCL, 0600);
    if (file >= 0) {
        ShareWithFolder(file, path_);
    } else if (errno == EEXIST) {
        file = open(path_.c_str(), common);
        if (file < 0 && errno == ENOENT)
            return {};
    }
    if (file < 0)
        return LookOnly(errno);
    std::optional<Outcome> outcome = TakeOpenFile(file, program, doubt);
    if (outcome == Outcome::Taken)
        file_ = file;
    else
        close(file);
    return outcome;
}

std::optional<FolderLock::Outcome> FolderLock::TakeOpenFile(int file, const std::string& program,
                                                            Doubt doubt) {
    struct stat status {};
    if (fstat(file, &status) != 0 || !S_ISREG(status.st_mode))
        return Fail(EINVAL);
    const int locked = lockCall_(file);
    if (locked == EAGAIN) {
        holder_ = ReadHolder(file);
        return Outcome::Held;
    }
    if (!Names(path_, file))
        return {};
    holder_ = ReadHolder(file);
    const bool elsewhere = !holder_.host.empty() && holder_.host != Shown(HostName());
    if (doubt == Doubt::Refuse && (elsewhere || (locked != 0 && IsAlive(holder_.process))))
        return Outcome::Doubtful;
    // A full disk keeps the name from the others, but the system's lock stands without it.
    if (!WriteHolder(file, program) && locked != 0)
        return Fail(errno);
    return Outcome::Taken;
}

// The lock cannot be taken where the file cannot be written, but somebody who can may have it.
FolderLock::Outcome FolderLock::LookOnly(int openError) {
    const int file = open(path_.c_str(), O_RDONLY | O_NOFOLLOW | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
    if (file < 0)
        return Fail(openError == ELOOP || openError == ENXIO ? EINVAL : openError);
    struct stat status {};
    struct flock region = LockRegion();
    const bool held = fstat(file, &status) == 0 && S_ISREG(status.st_mode) &&
                      fcntl(file, F_OFD_GETLK, &region) == 0 && region.l_type != F_UNLCK;
    if (held)
        holder_ = ReadHolder(file);
    close(file);
    return held ? Outcome::Held : Fail(openError == EISDIR ? EINVAL : openError);
}
