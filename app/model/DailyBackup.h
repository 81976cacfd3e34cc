#pragma once

#include <atomic>
#include <ctime>
#include <functional>
#include <mutex>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "util/File.h"

// Keeps what data files held before the first change of a day: in the folder "backups" beside each, a file
// such as invest.db.2026-11-22. Each of these is complete and on the disk under its name, or is not there at
// all; it is its owner's alone, unless the data file is several people's (PermissionsBeside). Of each data
// file the newest Generations are kept, and all that KeepPresent made, such as invest.db.2026-11-22-140307.
// Nothing that is named otherwise is touched, save NAME.part, where a copy is made.
//
// It does not see changes by itself: who is about to change one of the files calls Keep first (BackedUpFiles
// does so for a DATABASE), and holds the FolderLock of all their folders (TakeFolders) all the while. The
// application object or a tool owns it. Keep may be called from any thread; everything else belongs to the
// owner's.
class DailyBackup {
  public:
    static constexpr const char* FolderName = "backups";
    static constexpr std::size_t Generations = 7;

    using Clock = std::time_t (*)();
    static std::time_t SystemClock();

    // For the files of these names in the folder; one that does not exist is passed over, and of a symbolic
    // link the file that it leads to is kept, where that lies. They are kept together, so that the backups of
    // a day fit each other. `operations` must outlive the object.
    DailyBackup(const std::string& folder, const std::vector<std::string>& names,
                FileOperations& operations = SystemFiles(), Clock clock = SystemClock);
    DailyBackup(const DailyBackup&) = delete;
    DailyBackup& operator=(const DailyBackup&) = delete;
    // Removes what was prepared and not needed.
    ~DailyBackup();

    // The names of the data files whose contents refer to each other, this one among them.
    [[nodiscard]] static std::vector<std::string> FilesKeptWith(const std::string& name);

    // What lies in the folder's backups: the data file's name, and the day, or the day and time of
    // KeepPresent, that its backup has behind it. In the order of names, of each the oldest first.
    [[nodiscard]] static std::vector<std::pair<std::string, std::string>> KeptIn(const std::string& folder);
    // The path of the backup that has `suffix` behind the name of the file, whose own path is `file`.
    [[nodiscard]] static std::string Kept(const std::string& file, const std::string& suffix);

    // Has `tell` called the first time that Keep fails on a day, with the errno number. To be called before
    // the files change; `tell` runs on the thread that called Keep, must not wait for another, and must not
    // call Keep.
    void OnFailure(std::function<void(int)> tell) { tell_ = std::move(tell); }

    // Begins to copy the files on a thread of its own, so that the first Keep need not wait for it: to be
    // called once, before the files change. Copies that no Keep asks for leave no backup.
    void Prepare();

    // Returns once the files' backups of today are there, at once when it had made sure of that before. 0, or
    // the errno number of the first failure: then what could be kept was, and it is not tried again on this
    // day.
    [[nodiscard]] int Keep();

    // Keeps the files as they are now, beside the backups of the day, which it neither makes nor removes;
    // `suffix` gets what the copies have behind their names. 0, or the errno number of the first failure:
    // then some of them may be there.
    [[nodiscard]] int KeepPresent(std::string* suffix);

  private:
    // A file is named by its path.
    [[nodiscard]] bool BeginDay(std::time_t now);
    [[nodiscard]] bool IsWanted(const std::string& file) const;
    [[nodiscard]] int KeepAll();
    [[nodiscard]] int KeepFile(const std::string& file, const std::string& suffix);
    [[nodiscard]] int CopyToPart(const std::string& file);
    void EndPreparing();
    void RemoveOldOf(const std::string& file);

    std::vector<std::string> files_;
    FileOperations& operations_;
    const Clock clock_;
    std::function<void(int)> tell_;

    std::thread worker_;
    std::atomic<bool> stop_ = false;
    std::vector<std::string> prepared_; // the worker's until it has ended

    std::mutex mutex_;         // guards what follows
    std::string day_;          // "2026-11-22"
    std::time_t dayBegin_ = 0; // the day of which Keep has made sure
    std::time_t dayEnd_ = 0;
    int error_ = 0; // of that day
};

// The system's file operations for one DATABASE, which let the day's backup be kept before the data file
// changes. A file that was opened for reading and writing counts as data file; new files, such as a
// compaction's temporary one, do not, nor does the rename of a compaction: it drops nothing but deleted
// records. A backup that fails does not keep the change from being made: see DailyBackup::OnFailure.
//
// The owner of the DATABASE owns it and lets it live longer; it is used on the thread that uses the DATABASE.
class BackedUpFiles : public FileOperations {
  public:
    explicit BackedUpFiles(DailyBackup& backup) : backup_(backup) {}

    int Open(const char* path, int flags, mode_t mode) override;
    int Close(int descriptor) override;
    ssize_t WriteAt(int descriptor, const void* data, std::size_t size, off_t offset) override;
    int Truncate(int descriptor, off_t length) override;

  private:
    void BeforeChange(int descriptor);

    DailyBackup& backup_;
    std::vector<int> dataFiles_; // descriptors
};
