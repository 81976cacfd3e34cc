#include "tools/Backups.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <iterator>
#include <set>

#include "app/model/DailyBackup.h"
#include "app/model/DataFolders.h"
#include "tools/ToolFolder.h"
#include "util/Strings.h"

namespace {

constexpr std::array DataFiles = {PortfolioFile, InvestmentFile, CategoryFile};

// Why the file cannot be the data file of that name; empty when it can.
std::string WhyUnusable(const std::string& path, const std::string& name, FileOperations& operations) {
    DATABASE database(path.c_str(), operations);
    if (!database.IsOpen())
        return WhyNotOpened(path);
    if (database.IsDamaged())
        return "it is damaged: its header disagrees with it";
    const auto isWrong = [&](const DataFileKind& kind) { return kind.name == name && !kind.holds(database); };
    return std::any_of(DataFiles.begin(), DataFiles.end(), isWrong) ? "it has other columns than Quorvan's"
                                                                    : "";
}

// The data of the active records, sorted.
std::optional<std::vector<std::string>> RecordsOf(const std::string& path) {
    DATABASE database(path.c_str());
    DATABASE_HEADER header{};
    database.GetHeaderInfo(&header);
    std::vector<std::string> records;
    const auto add = [&](const void* data, long) {
        records.emplace_back(static_cast<const char*>(data),
                             static_cast<std::size_t>(header.recordLength) - 1);
    };
    if (!database.IsOpen() || !ForEachSelected(database, database.QueryReset(), add))
        return std::nullopt;
    std::sort(records.begin(), records.end());
    return records;
}

// Of the records of `from` that `than` has not: what names each of them in a file of that name, sorted.
std::vector<std::string> NamesLacking(const std::string& name, const std::vector<std::string>& from,
                                      const std::vector<std::string>& than) {
    std::vector<std::string> lacking;
    std::set_difference(from.begin(), from.end(), than.begin(), than.end(), std::back_inserter(lacking));
    if (name == InvestmentFile.name)
        for (std::string& record : lacking)
            record.resize(std::min(record.size(), offsetof(INVESTMENT_DATA, Ticker)));
    return lacking;
}

// One restoring of some files.
class Restoring {
  public:
    Restoring(const std::vector<BackupFile>& backups, FileOperations& operations)
        : backups_(backups), operations_(operations) {}
    // What is left of the copies.
    ~Restoring() {
        for (const BackupFile& backup : backups_)
            static_cast<void>(RemoveFile(operations_, Copy(backup)));
    }
    Restoring(const Restoring&) = delete;
    Restoring& operator=(const Restoring&) = delete;

    [[nodiscard]] std::string Prepare();
    [[nodiscard]] std::string Replace();

  private:
    [[nodiscard]] static std::string Copy(const BackupFile& backup) { return backup.present + ".part"; }
    [[nodiscard]] int MakeCopy(const BackupFile& backup);

    const std::vector<BackupFile>& backups_;
    FileOperations& operations_;
};

int Restoring::MakeCopy(const BackupFile& backup) {
    File source(operations_);
    File copy(operations_);
    File present(operations_);
    static_cast<void>(RemoveFile(operations_, Copy(backup))); // left by a program that was killed
    int error = source.Open(backup.path, FileMode::ReadOnly);
    error = error != 0 ? error : copy.Open(Copy(backup), FileMode::CreateNew);
    error = error != 0 ? error : copy.CopyFrom(source);
    const bool replaces = error == 0 && present.Open(backup.present, FileMode::ReadOnly) == 0;
    return replaces ? copy.TakeOwnerAndMode(present) : error;
}

std::string Restoring::Prepare() {
    for (const BackupFile& backup : backups_) {
        RestoreCompactionBackup(backup.present.c_str(), operations_); // it is what is there
        const int error = MakeCopy(backup);
        const std::string wrong =
            error != 0 ? Reason(error) : WhyUnusable(Copy(backup), backup.name, operations_);
        if (!wrong.empty())
            return backup.path + " cannot be used: " + wrong;
    }
    return {};
}

std::string Restoring::Replace() {
    std::string done;
    for (const BackupFile& backup : backups_) {
        int error = RenameFile(operations_, Copy(backup), backup.present);
        error = error != 0 ? error : SyncFolderOf(operations_, backup.present);
        if (error != 0)
            return backup.present + " cannot be replaced: " + Reason(error) +
                   (done.empty() ? "" : "; restored already:" + done + ", and doing it again finishes it");
        done += " " + backup.name;
    }
    return {};
}

} // namespace

std::vector<BackupFile> FindBackups(const std::string& folder) {
    std::set<std::string> names;
    for (const auto& [name, day] : DailyBackup::KeptIn(folder))
        names.insert(name);
    for (const DataFileKind& file : DataFiles)
        names.insert(file.name);
    std::vector<BackupFile> found;
    for (const std::string& name : names) {
        const std::string present = RealPath(folder + "/" + name);
        for (const auto& [kept, day] : DailyBackup::KeptIn(FolderOf(present)))
            if (FolderOf(present) + "/" + kept == present)
                found.push_back({name, day, DailyBackup::Kept(present, day), present});
    }
    std::stable_sort(found.begin(), found.end(),
                     [](const BackupFile& a, const BackupFile& b) { return a.day < b.day; });
    return found;
}

std::optional<RecordChanges> CompareRecords(const std::string& name, const std::string& path,
                                            const std::string& later, std::string& wrong) {
    const auto before = RecordsOf(path);
    const auto after = RecordsOf(later);
    if (!before || !after) {
        wrong = (before ? later : path) + " cannot be read: " + WhyNotOpened(before ? later : path);
        return std::nullopt;
    }
    const std::vector<std::string> gone = NamesLacking(name, *before, *after);
    const std::vector<std::string> come = NamesLacking(name, *after, *before);
    std::vector<std::string> changed;
    std::set_intersection(gone.begin(), gone.end(), come.begin(), come.end(), std::back_inserter(changed));
    const auto count = [](const std::vector<std::string>& all) {
        return static_cast<std::int64_t>(all.size());
    };
    return RecordChanges{count(*before), count(come) - count(changed), count(changed),
                         count(gone) - count(changed)};
}

std::string RestoreBackups(const std::string& folder, const std::vector<BackupFile>& backups,
                           std::string* kept, FileOperations& operations) {
    Restoring restoring(backups, operations);
    if (const std::string wrong = restoring.Prepare(); !wrong.empty())
        return wrong + "; nothing is changed";
    std::vector<std::string> names;
    for (const BackupFile& backup : backups)
        names.push_back(backup.name);
    if (const int error = DailyBackup(folder, names, operations).KeepPresent(kept); error != 0)
        return std::string("what is there cannot be kept in the folder ") + DailyBackup::FolderName + ": " +
               Reason(error) + "; nothing is changed";
    return restoring.Replace();
}
