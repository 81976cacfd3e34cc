#include "util/File.h"

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>
#include <utility>

#include <fcntl.h>
#include <unistd.h>

namespace {

// Calls until the result is something else than "interrupted".
template <class Call>
auto Retry(Call call) {
    auto result = call();
    while (result < 0 && errno == EINTR)
        result = call();
    return result;
}

int ErrorOf(int result) {
    return result < 0 ? errno : 0;
}

int FlagsOf(FileMode mode) {
    // Not blocking, so that a pipe in a file's place is refused instead of waited for.
    constexpr int common = O_CLOEXEC | O_NONBLOCK | O_NOCTTY;
    switch (mode) {
    case FileMode::ReadOnly:
        return O_RDONLY | common;
    case FileMode::WriteOnly:
        return O_WRONLY | O_CREAT | common;
    case FileMode::CreateNew:
        return O_RDWR | O_CREAT | O_EXCL | common;
    case FileMode::ReadWrite:
        break;
    }
    return O_RDWR | common;
}

// Whether the path, in which no folder is a link, is a name for what a process has open.
bool LeadsToOpenFile(const std::string& path) {
    return path.starts_with("/proc/");
}

// The errno number that tells why there is something that a file must not replace, or 0.
int WhyNotReplaced(const std::string& path) {
    if (LeadsToOpenFile(path))
        return EOPNOTSUPP;
    struct stat status {};
    if (stat(path.c_str(), &status) != 0)
        return 0;
    if (!S_ISREG(status.st_mode))
        return S_ISDIR(status.st_mode) ? EISDIR : EOPNOTSUPP;
    return access(path.c_str(), W_OK) == 0 ? 0 : errno;
}

} // namespace

int FileOperations::Open(const char* path, int flags, mode_t mode) {
    return ::open(path, flags, mode);
}

int FileOperations::Close(int descriptor) {
    return ::close(descriptor);
}

int FileOperations::Status(int descriptor, struct stat* status) {
    return ::fstat(descriptor, status);
}

ssize_t FileOperations::ReadAt(int descriptor, void* data, std::size_t size, off_t offset) {
    return ::pread(descriptor, data, size, offset);
}

ssize_t FileOperations::WriteAt(int descriptor, const void* data, std::size_t size, off_t offset) {
    return ::pwrite(descriptor, data, size, offset);
}

int FileOperations::Truncate(int descriptor, off_t length) {
    return ::ftruncate(descriptor, length);
}

int FileOperations::Sync(int descriptor) {
    return ::fsync(descriptor);
}

int FileOperations::SetOwner(int descriptor, uid_t owner, gid_t group) {
    return ::fchown(descriptor, owner, group);
}

int FileOperations::SetMode(int descriptor, mode_t mode) {
    return ::fchmod(descriptor, mode);
}

int FileOperations::Rename(const char* from, const char* to) {
    return ::rename(from, to);
}

int FileOperations::Remove(const char* path) {
    return ::unlink(path);
}

FileOperations& SystemFiles() {
    static FileOperations operations;
    return operations;
}

File::File(FileOperations& operations) : operations_(&operations) {}

File::File(File&& other) noexcept
    : operations_(other.operations_),
      descriptor_(std::exchange(other.descriptor_, -1)),
      written_(std::exchange(other.written_, false)) {}

File& File::operator=(File&& other) noexcept {
    if (this != &other) {
        Close();
        operations_ = other.operations_;
        descriptor_ = std::exchange(other.descriptor_, -1);
        written_ = std::exchange(other.written_, false);
    }
    return *this;
}

File::~File() {
    Close();
}

int File::Open(const std::string& path, FileMode mode) {
    Close();
    const mode_t permissions = mode == FileMode::CreateNew ? 0600 : 0666; // less the user's mask
    int opened = Retry([&] { return operations_->Open(path.c_str(), FlagsOf(mode), permissions); });
    if (opened < 0)
        return errno;
    descriptor_ = opened;
    struct stat status {};
    int error = ErrorOf(operations_->Status(descriptor_, &status));
    if (error == 0 && !S_ISREG(status.st_mode))
        error = EINVAL;
    if (error != 0)
        Close();
    return error;
}

void File::Close() {
    written_ = false;
    if (descriptor_ >= 0) {
        // An interrupted close has closed all the same; the bytes were the kernel's before.
        operations_->Close(std::exchange(descriptor_, -1));
    }
}

int File::ReadUpTo(std::int64_t offset, void* data, std::size_t size, std::size_t* got) const {
    *got = 0;
    while (*got < size) {
        auto* target = static_cast<char*>(data) + *got;
        ssize_t count = Retry([&] {
            return operations_->ReadAt(descriptor_, target, size - *got, offset + static_cast<off_t>(*got));
        });
        if (count < 0)
            return errno;
        if (count == 0)
            break;
        *got += static_cast<std::size_t>(count);
    }
    return 0;
}

int File::ReadAt(std::int64_t offset, void* data, std::size_t size) const {
    std::size_t got = 0;
    int error = ReadUpTo(offset, data, size, &got);
    return error == 0 && got < size ? ENODATA : error;
}

int File::WriteAt(std::int64_t offset, const void* data, std::size_t size) {
    written_ = true;
    std::size_t done = 0;
    while (done < size) {
        const auto* source = static_cast<const char*>(data) + done;
        ssize_t count = Retry([&] {
            return operations_->WriteAt(descriptor_, source, size - done, offset + static_cast<off_t>(done));
        });
        if (count < 0)
            return errno;
        if (count == 0)
            return EIO;
        done += static_cast<std::size_t>(count);
    }
    return 0;
}

int File::Length(std::int64_t* length) const {
    struct stat status {};
    int error = ErrorOf(operations_->Status(descriptor_, &status));
    *length = status.st_size;
    return error;
}

int File::Truncate(std::int64_t length) {
    written_ = true;
    return ErrorOf(Retry([&] { return operations_->Truncate(descriptor_, length); }));
}

int File::Sync() {
    written_ = false;
    return ErrorOf(Retry([&] { return operations_->Sync(descriptor_); }));
}

int File::TakeOwnerAndMode(const File& other) {
    struct stat theirs {};
    return operations_->Status(other.descriptor_, &theirs) < 0 ? errno
                                                               : TakeOwner(theirs, theirs.st_mode & 07777);
}

int File::CopyFrom(const File& other, const std::atomic<bool>* stop) {
    struct stat theirs {};
    int error = ErrorOf(operations_->Status(other.descriptor_, &theirs));
    error = error != 0 ? error : CopyBytes(other, stop);
    error = error != 0 ? error : TakeOwner(theirs, PermissionsBeside(theirs.st_mode));
    return error != 0 ? error : Sync();
}

int File::CopyBytes(const File& other, const std::atomic<bool>* stop) {
    constexpr std::size_t bufferSize = std::size_t{256} * 1024;
    const auto buffer = std::make_unique<char[]>(bufferSize);
    std::size_t got = bufferSize;
    for (std::int64_t offset = 0; got == bufferSize; offset += static_cast<std::int64_t>(got)) {
        if (stop != nullptr && *stop)
            return ECANCELED;
        if (const int error = other.ReadUpTo(offset, buffer.get(), bufferSize, &got); error != 0)
            return error;
        if (const int error = WriteAt(offset, buffer.get(), got); error != 0)
            return error;
    }
    return 0;
}

int File::TakeOwner(const struct stat& theirs, mode_t mode) {
    struct stat ours {};
    if (operations_->Status(descriptor_, &ours) < 0)
        return errno;
    if (ours.st_uid != theirs.st_uid || ours.st_gid != theirs.st_gid) {
        if (operations_->SetOwner(descriptor_, theirs.st_uid, theirs.st_gid) < 0)
            mode &= 0777; // another's file: what runs in the owner's name must not move to us
    }
    return SetMode(mode);
}

int File::SetMode(mode_t mode) {
    return ErrorOf(Retry([&] { return operations_->SetMode(descriptor_, mode); }));
}

mode_t PermissionsBeside(mode_t mode) {
    const mode_t group = (mode & 020) != 0 ? 070 : 0;
    const mode_t others = (mode & 002) != 0 ? 007 : 0;
    return mode & (0700 | group | others);
}

bool File::IsAt(const std::string& path) const {
    struct stat ours {};
    struct stat theirs {};
    return descriptor_ >= 0 && operations_->Status(descriptor_, &ours) == 0 &&
           ::stat(path.c_str(), &theirs) == 0 && ours.st_dev == theirs.st_dev && ours.st_ino == theirs.st_ino;
}

int RenameFile(FileOperations& operations, const std::string& from, const std::string& to) {
    return ErrorOf(Retry([&] { return operations.Rename(from.c_str(), to.c_str()); }));
}

int RemoveFile(FileOperations& operations, const std::string& path) {
    return ErrorOf(Retry([&] { return operations.Remove(path.c_str()); }));
}

int SyncFolderOf(FileOperations& operations, const std::string& path) {
    const std::string folder = FolderOf(path);
    int descriptor =
        Retry([&] { return operations.Open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC, 0); });
    if (descriptor < 0)
        return errno == EACCES ? 0 : errno;
    const int error = ErrorOf(Retry([&] { return operations.Sync(descriptor); }));
    operations.Close(descriptor);
    return error == EINVAL ? 0 : error;
}

std::string FolderOf(const std::string& path) {
    const std::filesystem::path file(path);
    return file.has_parent_path() ? file.parent_path().string() : ".";
}

bool FileExists(const std::string& path) {
    struct stat status {};
    return ::lstat(path.c_str(), &status) == 0;
}

std::string FollowLinks(const std::string& path) {
    namespace fs = std::filesystem;
    constexpr int mostLinks = 40; // the system's own bound
    std::error_code error;
    fs::path current(path);
    for (int links = 0; links <= mostLinks; ++links) {
        fs::path folder = fs::canonical(FolderOf(current.string()), error);
        if (error)
            return {};
        current = folder / current.filename();
        if (LeadsToOpenFile(current.string()) || !fs::is_symlink(fs::symlink_status(current, error)))
            return current.string();
        fs::path target = fs::read_symlink(current, error);
        if (error)
            return {};
        current = folder / target; // an absolute target replaces the folder
    }
    return {};
}

int ReadWholeFile(const std::string& path, std::string& content, std::size_t maxBytes) {
    content.clear();
    File file;
    std::int64_t length = 0;
    int error = file.Open(path, FileMode::ReadOnly);
    error = error != 0 ? error : file.Length(&length);
    if (error == 0 && length > static_cast<std::int64_t>(maxBytes))
        error = EFBIG;
    if (error != 0)
        return error;
    content.resize(static_cast<std::size_t>(length));
    std::size_t got = 0;
    error = file.ReadUpTo(0, content.data(), content.size(), &got);
    content.resize(error != 0 ? 0 : got);
    return error;
}

int WriteWholeFile(const std::string& path, const std::string& temporaryPath, std::string_view content,
                   mode_t mode, ExistingFile existing) {
    struct stat replaced {};
    if (existing == ExistingFile::Replace && ::stat(path.c_str(), &replaced) == 0)
        mode = replaced.st_mode & 0777;
    File file;
    int error = RemoveFile(SystemFiles(), temporaryPath);
    if (error == 0 || error == ENOENT)
        error = file.Open(temporaryPath, FileMode::CreateNew);
    if (error != 0)
        return error;
    error = file.WriteAt(0, content.data(), content.size());
    error = error != 0 ? error : file.SetMode(mode);
    error = error != 0 ? error : file.Sync();
    if (error == 0)
        error = existing == ExistingFile::Replace ? RenameFile(SystemFiles(), temporaryPath, path)
                                                  : MoveWithoutReplacing(temporaryPath, path);
    if (error != 0)
        static_cast<void>(RemoveFile(SystemFiles(), temporaryPath));
    return error;
}

int WriteNamedFile(const std::string& path, std::string_view content) {
    const mode_t mask = umask(0);
    umask(mask);
    const std::string real = FollowLinks(path);
    const std::string& target = real.empty() ? path : real;
    if (const int error = WhyNotReplaced(target); error != 0)
        return error;
    return WriteWholeFile(target, target + ".part" + std::to_string(getpid()), content, 0666 & ~mask,
                          ExistingFile::Replace);
}

int MoveWithoutReplacing(const std::string& from, const std::string& to) {
    const int error = ErrorOf(renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE));
    // Not every file system knows that call; a second name for the file does not replace either.
    if (error != EINVAL && error != ENOSYS)
        return error;
    return ErrorOf(::link(from.c_str(), to.c_str()) == 0 ? ::unlink(from.c_str()) : -1);
}

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
