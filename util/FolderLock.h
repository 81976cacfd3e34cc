#pragma once

#include <optional>
#include <string>

// Who uses a folder, as the lock file tells; what it does not tell is empty or 0.
struct FolderHolder {
    std::string program;
    long process = 0;
    std::string host;
    std::string since; // the holder's local time, "2026-11-22 14:03:07"
};

// A few words for a sentence: "quorvan (process 4711 on the computer desk, since 2026-11-22 14:03:07)", or
// "another program" when the file does not tell.
[[nodiscard]] std::string DescribeHolder(const FolderHolder& holder);

// Keeps a folder with data files for one program: who changes a data file holds the lock of the folder that
// the file lies in, from before it is opened until it is closed. Reading alone needs no lock. The lock is the
// system's own, on the file Quorvan.lock in the folder, and ends with the process however that ends; the
// file's text only names the holder (doc/lock-file.md). Releasing removes the file. A file that another
// holder locked is neither removed nor written.
//
// It does not guard against programs that do not ask. One object holds one folder at most, also against other
// objects in the same process. Whoever changes the files owns it; one thread at a time. Not for use across
// fork: a child keeps the lock until it ends or runs another program.
class FolderLock {
  public:
    static constexpr const char* FileName = "Quorvan.lock";

    enum class Outcome {
        Taken,
        Held,     // somebody else has it
        Doubtful, // whether the one whom the file names still has it cannot be known: see Take
        Failed,   // the file cannot be made or written: see Error
    };
    enum class Doubt { Refuse, PassOver };

    // Locks the open file for the calling object, at once or not at all: 0 or an errno number, EAGAIN when
    // somebody else has it. Any other means that the file system has no locks.
    using LockCall = int (*)(int file);
    static int LockBySystem(int file);

    explicit FolderLock(LockCall lockCall = LockBySystem);
    FolderLock(const FolderLock&) = delete;
    FolderLock& operator=(const FolderLock&) = delete;
    ~FolderLock();

    // Takes the lock of the folder for this process under the name `program`, releasing the folder held
    // before. What a crashed holder left behind is no obstacle, with two exceptions, in which the system's
    // lock does not tell: the file names another computer, whose lock a network folder may not have passed
    // on; or the file system has no locks, and the process that the file names is alive. Both are Doubtful
    // and nothing is changed; with Doubt::PassOver, for a person who knows that nobody is there, the lock is
    // taken.
    [[nodiscard]] Outcome Take(const std::string& folder, const std::string& program,
                               Doubt doubt = Doubt::Refuse);
    void Release();
    [[nodiscard]] bool IsTaken() const { return file_ >= 0; }

    // After Held and Doubtful: who has it.
    [[nodiscard]] const FolderHolder& Holder() const { return holder_; }
    // After Failed: the errno number that says why; EINVAL when the lock file's name is taken by something
    // else.
    [[nodiscard]] int Error() const { return error_; }

  private:
    // Nothing when the file was removed meanwhile.
    [[nodiscard]] std::optional<Outcome> TryToTake(const std::string& program, Doubt doubt);
    [[nodiscard]] std::optional<Outcome> TakeOpenFile(int file, const std::string& program, Doubt doubt);
    [[nodiscard]] Outcome LookOnly(int openError);
    [[nodiscard]] Outcome Fail(int error);

    LockCall lockCall_;
    std::string path_;
    int file_ = -1;
    FolderHolder holder_;
    int error_ = 0;
};
