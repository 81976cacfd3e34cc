#include "app/model/DataFolders.h"

#include <algorithm>
#include <filesystem>
#include <system_error>

#include "db/File.h"

namespace fs = std::filesystem;

std::string RealPath(const std::string& path) {
    std::string real = FollowLinks(path);
    return real.empty() ? path : real;
}

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
