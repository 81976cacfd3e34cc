#pragma once

#include <string>

#include "util/File.h"

/// The files that take part in a compaction (DATABASE::Compress).
struct COMPACTION_PATHS {
    std::string data;      ///< the data file itself, symbolic links followed
    std::string temporary; ///< the same name with the extension .new
    std::string backup;    ///< the same name with the extension .bak
};

/// Derives the paths for the data file at `path`, which need not exist. False when its folder does not exist,
/// when a derived path is longer than 127 characters, or when the data file itself has one of the derived
/// names.
[[nodiscard]] bool FindCompactionPaths(const std::string& path, COMPACTION_PATHS* paths);

/// What an interrupted compaction left where nothing is at `path` itself: its backup, which is whole for
/// certain, or else its temporary file. Empty for neither. No new file may be made there: the next compaction
/// of that would remove it.
[[nodiscard]] std::string FindCompactionLeftover(const std::string& path);

/// Undoes what a compaction that was ended between its two renames leaves behind: when nothing is at `path`
/// but its backup lies beside it, the backup gets its name back. To be called before the file is opened.
/// Nothing else is touched; a temporary file that was left over is overwritten by the next compaction.
/// Returns 1 when the backup was put back, 0 when there was nothing to do, -1 when it could not be renamed.
int RestoreCompactionBackup(const char* path, FileOperations& operations = SystemFiles());
