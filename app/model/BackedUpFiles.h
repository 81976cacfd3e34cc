#pragma once

#include <vector>

#include "db/File.h"

class DailyBackup;

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
