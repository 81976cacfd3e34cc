#pragma once

#include <string>
#include <vector>

// A data file may be a symbolic link. What belongs to it, its folder's lock and its backups, belongs to the
// folder in which it really lies: there other programs find it by its own name.

// The path of the data file itself; `path` as it is where links lead nowhere.
[[nodiscard]] std::string RealPath(const std::string& path);

// The folder, and the others in which files of these names in it really lie. None is there twice, under
// whatever names links lead to it, so that each can be locked.
[[nodiscard]] std::vector<std::string> FoldersOf(const std::string& folder,
                                                 const std::vector<std::string>& names);
