#include "tools/Backups.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <iterator>
#include <list>
#include <set>

#include "app/model/DailyBackup.h"
#include "app/model/DataFolders.h"
#include "tools/DataFileCopy.h"
#include "util/Strings.h"

namespace {

constexpr std::array DataFiles = {PortfolioFile, InvestmentFile, CategoryFile};

// How the data file of that name is known to be that; any other only has to be one.
DataFileKind KindOf(const std::string& name) {
    const auto* known = std::find_if(
        DataFiles.begin(), DataFiles.end(), [&](const DataFileKind& kind) { return kind.name == name; });
    return known != DataFiles.end() ? *known : DataFileKind{name.c_str(), [](DATABASE&) { return true; }};
}

// Makes the copy that is to take the place of the data file, and looks at it.
std::string Prepare(DataFileCopy& copy, const BackupFile& backup, FileOperations& operations) {
    RestoreCompactionBackup(backup.present.c_str(), operations); // it is what is there
    if (std::string wrong = copy.Make(backup.path); !wrong.empty())
        return wrong;
    if (copy.Data().IsDamaged())
        return "it is damaged: its header disagrees with it";
    return KindOf(backup.name).holds(copy.Data()) ? copy.Finish() : "it has other columns than Quorvan's";
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

} // namespace

std::vector<BackupFile> FindBackups(const std::string& folder, const std::vector<std::string>& others) {
    std::set<std::string> names;
    for (const auto& [name, day] : DailyBackup::KeptIn(folder))
        if (std::find(others.begin(), others.end(), name) != others.end())
            names.insert(name);
    for (const DataFileKind& file : DataFiles)
        names.insert(file.name);
    std::vector<BackupFile> found;
    for (const std::string& name : names) {
        const std::string present = RealPath(folder + "/" + name);
        for (const auto& [kept, day] : DailyBackup::KeptIn(FolderOf(present)))
            if (present.ends_with("/" + kept))
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

std::string RestoreBackups(const ToolFolder& folder, const std::vector<BackupFile>& backups,
                           std::string* kept, FileOperations& operations) {
    std::list<DataFileCopy> copies;
    std::vector<std::string> names;
    for (const BackupFile& backup : backups) {
        DataFileCopy& copy = copies.emplace_back(folder, KindOf(backup.name), operations);
        if (const std::string wrong = Prepare(copy, backup, operations); !wrong.empty())
            return backup.path + " cannot be used: " + wrong + "; nothing is changed";
        names.push_back(backup.name);
    }
    if (const int error = DailyBackup(folder.Path(), names, operations).KeepPresent(kept); error != 0)
        return std::string("what is there cannot be kept in the folder ") + DailyBackup::FolderName + ": " +
               Reason(error) + "; nothing is changed";
    const std::string goesOn = "; what was there is kept as " + *kept + ", and doing it again finishes it";
    std::string done;
    std::string unsure;
    auto name = names.begin();
    for (DataFileCopy& copy : copies) {
        if (const std::string wrong = copy.TakePlace(&unsure); !wrong.empty())
            return wrong + (done.empty() ? "" : "; restored already:" + done) + goesOn;
        done += ' ';
        done += *name++;
    }
    return unsure.empty() ? "" : unsure + goesOn;
}
