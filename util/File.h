#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include <sys/stat.h>
#include <sys/types.h>

// The system calls through which files are opened, read and changed, one virtual operation each (what only
// looks at names, such as FileExists, asks the system itself). Results are the system's: negative (with
// errno set) on failure. Tests derive from it to make a chosen call fail, write short or end the process;
// the program uses SystemFiles().
class FileOperations {
  public:
    FileOperations() = default;
    FileOperations(const FileOperations&) = delete;
    FileOperations& operator=(const FileOperations&) = delete;
    virtual ~FileOperations() = default;

    virtual int Open(const char* path, int flags, mode_t mode);
    virtual int Close(int descriptor);
    virtual int Status(int descriptor, struct stat* status);
    virtual ssize_t ReadAt(int descriptor, void* data, std::size_t size, off_t offset);
    virtual ssize_t WriteAt(int descriptor, const void* data, std::size_t size, off_t offset);
    virtual int Truncate(int descriptor, off_t length);
    virtual int Sync(int descriptor);
    virtual int SetOwner(int descriptor, uid_t owner, gid_t group);
    virtual int SetMode(int descriptor, mode_t mode);
    virtual int Rename(const char* from, const char* to);
    virtual int Remove(const char* path);
};

// The operations that go straight to the system. They hold no state and live as long as the program.
FileOperations& SystemFiles();

// How File::Open treats the file.
enum class FileMode {
    ReadWrite, // it must exist
    ReadOnly,  // it must exist
    WriteOnly, // made, as the user's mask has it, when it does not exist; it is not truncated
    CreateNew, // it must not exist (not even as a symbolic link); for reading and writing, its owner's
               // alone
};

// The permissions for a copy of a file, or for a folder in a folder, whose permissions are `mode`: the
// owner's, and those of the group and of all others as far as they may write there, since it is theirs then
// too. Who may only read gets none.
[[nodiscard]] mode_t PermissionsBeside(mode_t mode);

// One open file, read and written by position. It is the only place where data files are touched.
// Interrupted calls and short transfers are continued until they are complete or fail. It buffers nothing:
// when a write returns, the kernel has the bytes. It knows nothing about what the bytes mean.
//
// Every operation that can fail returns 0 or the errno number of the failure. The owner of a File uses it on
// one thread at a time.
class File {
  public:
    // A File without an open file; `operations` must outlive it.
    explicit File(FileOperations& operations = SystemFiles());
    File(File&& other) noexcept;
    File& operator=(File&& other) noexcept;
    ~File();

    // Opens the file at `path`, closing the one that was open. Anything but a regular file is refused
    // (EINVAL).
    [[nodiscard]] int Open(const std::string& path, FileMode mode);
    void Close();
    [[nodiscard]] bool IsOpen() const { return descriptor_ >= 0; }

    // Reads exactly `size` bytes; a file that ends before is ENODATA.
    [[nodiscard]] int ReadAt(std::int64_t offset, void* data, std::size_t size) const;
    // Reads up to `size` bytes; `got` becomes the number read, less than `size` only at the end of the file.
    [[nodiscard]] int ReadUpTo(std::int64_t offset, void* data, std::size_t size, std::size_t* got) const;
    // Writes all of `size` bytes. After a failure any part of them may have been written.
    [[nodiscard]] int WriteAt(std::int64_t offset, const void* data, std::size_t size);

    [[nodiscard]] int Length(std::int64_t* length) const;
    [[nodiscard]] int Truncate(std::int64_t length);
    // Returns when the file's bytes have reached the disk.
    [[nodiscard]] int Sync();
    // Tells whether anything was written to the open file since it was opened or since the last Sync, a
    // failed one included: the system forgets what it could not bring to the disk, and says yes when it is
    // asked again.
    [[nodiscard]] bool IsWritten() const { return written_; }
    [[nodiscard]] int SetMode(mode_t mode);
    // Gives this file the permissions of `other` and, as far as the process may, its owner and group.
    [[nodiscard]] int TakeOwnerAndMode(const File& other);
    // Makes this new file a copy of `other` on the disk, with its owner and PermissionsBeside. Ends with
    // ECANCELED once `stop` is true.
    [[nodiscard]] int CopyFrom(const File& other, const std::atomic<bool>* stop = nullptr);
    // Tells whether `path` names this very file.
    [[nodiscard]] bool IsAt(const std::string& path) const;

  private:
    [[nodiscard]] int TakeOwner(const struct stat& theirs, mode_t mode);
    [[nodiscard]] int CopyBytes(const File& other, const std::atomic<bool>* stop);

    FileOperations* operations_;
    int descriptor_ = -1;
    bool written_ = false;
};

// Renames a file, replacing what is at `to`. Returns 0 or an errno number.
[[nodiscard]] int RenameFile(FileOperations& operations, const std::string& from, const std::string& to);
// Removes a file. Returns 0 or an errno number.
[[nodiscard]] int RemoveFile(FileOperations& operations, const std::string& path);
// Returns when the names in the folder that holds `path` have reached the disk, or at once where the system
// has no way to wait for it: in a folder that may not be read, or a file system that does not know how.
// Returns 0 or an errno number.
[[nodiscard]] int SyncFolderOf(FileOperations& operations, const std::string& path);
// The folder of a path, "." for a mere name.
[[nodiscard]] std::string FolderOf(const std::string& path);
// Tells whether a file, folder or symbolic link of that name exists.
[[nodiscard]] bool FileExists(const std::string& path);
// The absolute path of the file that `path` leads to through symbolic links, also when that file does not
// exist (yet). Empty when the folder does not exist or the links form a ring. A link in /proc, where that of
// /dev/stdout leads, is not followed: it stands for what a process has open.
[[nodiscard]] std::string FollowLinks(const std::string& path);

// Small files read and written as a whole: a reader finds the old content or the new one, never a part.

// Reads the regular file at `path` into `content`. Returns 0 or, with `content` empty, the errno number:
// EINVAL for what is no regular file, EFBIG for one that is longer than `maxBytes`.
[[nodiscard]] int ReadWholeFile(const std::string& path, std::string& content, std::size_t maxBytes);

enum class ExistingFile { Replace, Keep };

// Writes `content` to `temporaryPath`, which must lie in the folder of `path` and is replaced when it exists,
// flushes it to the disk and moves it to `path`. Should anything fail, or the program be killed at any
// moment, `path` is what it was; a temporary that this call began is removed unless the program was killed.
// A file that is replaced keeps its permissions, a new one gets exactly `mode`. With ExistingFile::Keep an
// existing `path` is never replaced, not even one that appears meanwhile: EEXIST. Returns 0 or an errno
// number.
[[nodiscard]] int WriteWholeFile(const std::string& path, const std::string& temporaryPath,
                                 std::string_view content, mode_t mode, ExistingFile existing);

// WriteWholeFile for a file that a person named: it is as private as the person wants new files, a link to it
// stays a link, and what is no regular file, may not be written or lies in /proc is left alone.
[[nodiscard]] int WriteNamedFile(const std::string& path, std::string_view content);

// Renames `from` to `to`, which must not exist, not even as a link that leads nowhere: EEXIST then. Returns 0
// or an errno number.
[[nodiscard]] int MoveWithoutReplacing(const std::string& from, const std::string& to);

// Finds out whether files can be made and filled in the folder now, by doing it: a temporary file is made,
// loses its name at once, and takes some bytes. 0, or the errno number that says why not: EROFS, EACCES,
// ENOSPC and the like. A folder that takes them may still refuse more.
[[nodiscard]] int TryWritingIn(const std::string& folder);

// Appends `text` as it is to the debug log at `logPath`, creating the log where needed, for its owner alone;
// the text "CLEAR" empties the log instead. The log is complete on disk when the call returns. A log that
// cannot be opened is passed over in silence. May be called from any thread: each text goes out in one write,
// so texts do not mix.
void PrintDebugStatement(const char* text, const char* logPath);
