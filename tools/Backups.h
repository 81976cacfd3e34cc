#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "tools/ToolFolder.h"

// A backup of a data file of the program's folder (app/model/DailyBackup.h).
struct BackupFile {
    std::string name;    // of the data file in the folder
    std::string day;     // "2026-11-22", or "2026-11-24-140307" for what a restore replaced
    std::string path;    // of the backup
    std::string present; // where the data file itself really lies
};

// The backups of the folder's three data files and of the `others` that are named, by their days and, on a
// day, their names.
[[nodiscard]] std::vector<BackupFile> FindBackups(const std::string& folder,
                                                  const std::vector<std::string>& others = {});

// How a data file became another one, in records. One counts as changed when portfolio and name of an
// investment are the same.
struct RecordChanges {
    std::int64_t records = 0; // in the first
    std::int64_t added = 0;
    std::int64_t changed = 0;
    std::int64_t removed = 0;
};

// Compares the active records of the data file `path`, of a file called `name`, with those of `later`.
// Nothing, with the reason in `wrong`, when one of them cannot be read.
[[nodiscard]] std::optional<RecordChanges> CompareRecords(const std::string& name, const std::string& path,
                                                          const std::string& later, std::string& wrong);

// Puts the backups in the places of the data files, of the folder that the caller has locked. Each is copied
// beside its data file and looked at first, then what is there is kept as one more backup, of which `kept`
// gets the day and time, and only then the first copy takes its place, with owner and permissions of the file
// that it replaces. Killed at any moment, each data file is the old one or the new one; done again, it is
// finished. Returns an empty text, or what hindered it: a sentence without its full stop, which says what was
// done.
[[nodiscard]] std::string RestoreBackups(const ToolFolder& folder, const std::vector<BackupFile>& backups,
                                         std::string* kept, FileOperations& operations = SystemFiles());
