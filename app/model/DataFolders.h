#pragma once

#include <functional>
#include <list>
#include <string>
#include <vector>

#include "util/FolderLock.h"

// A data file may be a symbolic link. What belongs to it, its folder's lock and its backups, belongs to the
// folder in which it really lies: there other programs find it by its own name.

// The path of the data file itself; `path` as it is where links lead nowhere.
[[nodiscard]] std::string RealPath(const std::string& path);

// Takes, under the name `program`, the locks of the folder and of the others in which files of these names in
// it really lie, as long as `goesOn` agrees to what came of each. False when it did not; `locks`, which gets
// one for each folder asked for, keeps what was taken.
[[nodiscard]] bool
TakeFolders(std::list<FolderLock>& locks, const std::string& folder, const std::vector<std::string>& names,
            const char* program,
            const std::function<bool(FolderLock&, const std::string&, FolderLock::Outcome)>& goesOn);
