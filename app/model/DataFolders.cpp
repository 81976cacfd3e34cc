#include "app/model/DataFolders.h"

#include <algorithm>
#include <filesystem>
#include <system_error>

#include "util/File.h"

namespace fs = std::filesystem;

namespace {

// The folder, and the others in which files of these names in it really lie. None is there twice, under
// whatever names links lead to it, so that each can be locked.
std::vector<std::string> FoldersOf(const std::string& folder, const std::vector<std::string>& names) {
    std::vector<std::string> folders = {folder};
    for (const std::string& name : names) {
        const std::string real = FolderOf(RealPath((fs::path(folder) / name).string()));
        const auto isReal = [&real](const std::string& each) {
            std::error_code notThere;
            return each == real || fs::equivalent(each, real, notThere);
        };
        if (std::none_of(folders.begin(), folders.end(), isReal))
            folders.push_back(real);
    }
    return folders;
}

} // namespace

std::string RealPath(const std::string& path) {
    std::string real = FollowLinks(path);
    return real.empty() ? path : real;
}

bool TakeFolders(std::list<FolderLock>& locks, const std::string& folder,
                 const std::vector<std::string>& names, const char* program,
                 const std::function<bool(FolderLock&, const std::string&, FolderLock::Outcome)>& goesOn) {
    const std::vector<std::string> folders = FoldersOf(folder, names);
    return std::all_of(folders.begin(), folders.end(), [&](const std::string& each) {
        FolderLock& lock = locks.emplace_back();
        return goesOn(lock, each, lock.Take(each, program));
    });
}
