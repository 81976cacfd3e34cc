#pragma once

#include <memory>
#include <string>

#include "db/Database.h"

// How the program opens a data file at start: what it found is said in words that a person understands.

// The system's file operations for looking only: what would make or change a file fails with EROFS. A
// DATABASE opens its file for reading then. It holds no state.
class ReadOnlyFiles : public FileOperations {
  public:
    int Open(const char* path, int flags, mode_t mode) override;
    int Rename(const char* from, const char* to) override;
    int Remove(const char* path) override;
};

enum class DataFileUse { Change, Look };

// Opens the data file `name` in the folder for a DATABASE that holds(), and appends to `complaints`, each
// with its newline, a sentence about everything that a person should know: that the file is missing, cannot
// be opened, is no such data file, is damaged, or, with DataFileUse::Change, cannot be written. What an
// interrupted compaction has left is put right first. The result is never null; without a usable file it is a
// DATABASE that has none. `operations` must outlive it.
[[nodiscard]] std::unique_ptr<DATABASE> OpenDataFile(const std::string& folder, const std::string& name,
                                                     bool (*holds)(DATABASE&), DataFileUse use,
                                                     FileOperations& operations, std::string& complaints);
