#include "tools/ToolFolder.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <system_error>

#include "app/model/DataFolders.h"
#include "db/Database.h"
#include "db/FileCheck.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

std::string WhyNotOpened(const std::string& path) {
    FileCheck check;
    const int error = check.Run(path);
    if (error == 0 && !check.Findings().empty() && !check.IsSound())
        return check.Findings().front().text;
    if (const std::string leftover = FindCompactionLeftover(path); error == ENOENT && !leftover.empty())
        return "there is no such file, but " + leftover +
               ", as an interrupted compaction leaves it; `check --repair` gives it the file's name";
    if (error == EINVAL)
        return "this is no regular file";
    if (error != 0)
        return Reason(error);
    return path.size() >= PathBufferSize ? "the path is longer than 127 bytes" : "there is no memory for it";
}

std::string ToolFolder::PathOf(const DataFileKind& file) const {
    return (std::filesystem::path(folder_) / file.name).string();
}

std::string ToolFolder::WhyNotThere() const {
    std::error_code error;
    // Where that may not be seen, what is opened or made says so.
    return std::filesystem::is_directory(folder_, error) || error == std::errc::permission_denied
               ? ""
               : "there is no folder " + folder_;
}

std::string ToolFolder::Lock() {
    std::string wrong = WhyNotThere();
    if (!wrong.empty())
        return wrong;
    const auto goesOn = [&wrong](const FolderLock& lock, const std::string& folder,
                                 FolderLock::Outcome outcome) {
        if (const std::string use = UseOf(lock, folder, outcome); !use.empty())
            wrong = "the folder" + use + (outcome == FolderLock::Outcome::Held ? "; nothing is changed" : "");
        // Where a link leads to no folder, there is no file either.
        else if (outcome == FolderLock::Outcome::Failed && lock.Error() != ENOENT)
            wrong = "other programs cannot be kept out of the folder: " + folder + "/" +
                    FolderLock::FileName +
                    (lock.Error() == EINVAL ? " is in the way" : " cannot be made: " + Reason(lock.Error()));
        return wrong.empty();
    };
    static_cast<void>(TakeFolders(locks_, folder_, names_, ToolName, goesOn));
    return wrong;
}

std::string ToolFolder::KeepBackup() {
    const int error = DailyBackup(folder_, names_, operations_).Keep();
    return error == 0 ? ""
                      : std::string("the day's backup cannot be made in the folder ") +
                            DailyBackup::FolderName + " beside it: " + Reason(error) + "; nothing is changed";
}

std::unique_ptr<DATABASE> ToolFolder::Open(const DataFileKind& file, DataFileUse use,
                                           std::string& wrong) const {
    wrong = WhyNotThere();
    if (!wrong.empty())
        return nullptr;
    const std::string path = PathOf(file);
    const bool change = use == DataFileUse::Change;
    if (change)
        RestoreCompactionBackup(path.c_str(), operations_); // where it fails, the file is missing
    auto database = std::make_unique<DATABASE>(path.c_str(), operations_);
    if (!database->IsOpen())
        wrong = path + " cannot be opened: " + WhyNotOpened(path);
    else if (!file.holds(*database))
        wrong = path + " has other columns than Quorvan's";
    else if (change && database->IsReadOnly())
        wrong = path + " may only be read, not changed";
    else {
        wrong = !database->IsDamaged() ? ""
                                       : path + " is damaged: its header disagrees with it, and " +
                                             (change ? "nothing is changed before `check --repair`"
                                                     : "records may be missing; see `check`");
        return wrong.empty() || !change ? std::move(database) : nullptr;
    }
    return nullptr;
}

std::string ToolFolder::FindPortfolio(DATABASE& portfolios, std::string& name, Letters letters) const {
    const long count = CanBePortfolioName(name.c_str()) ? SelectPortfolios(portfolios, name.c_str()) : 0;
    const void* found = count > 0 ? portfolios.QueryGetFirst(nullptr) : nullptr;
    if (!found)
        return count == 0 ? "there is no portfolio \"" + name + "\" in " + folder_
                          : NotAllRead("portfolios", folder_);
    PORTFOLIO_DATA record;
    std::memcpy(&record, found, sizeof record);
    const std::string written(FieldText(record.Name));
    if (letters == Letters::Exact && written != name)
        return "there is no portfolio \"" + name + "\" in " + folder_ + ", but \"" + written + "\"";
    name = written;
    return {};
}
