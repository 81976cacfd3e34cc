#pragma once

#include <list>
#include <memory>
#include <string>
#include <vector>

#include "app/model/DailyBackup.h"
#include "app/model/DataFileOpening.h"
#include "app/model/PortfolioRules.h"
#include "util/FolderLock.h"

// A data file of the program's folder, and how it is known to be that.
struct DataFileKind {
    const char* name;
    bool (*holds)(DATABASE&);
};
inline constexpr DataFileKind PortfolioFile{"portfol.db", HoldsPortfolios};
inline constexpr DataFileKind InvestmentFile{"invest.db", HoldsInvestments};
inline constexpr DataFileKind CategoryFile{"misc.db", HoldsCategories};

// Why no DATABASE opens the file at `path`, in words that go on a sentence.
[[nodiscard]] std::string WhyNotOpened(const std::string& path);

// A folder with data files as a tool works in it. Who only looks opens the files. Who changes one calls Lock
// first, then opens, and calls KeepBackup before the first change. It keeps other programs out until it goes,
// and opens no file by itself.
//
// Each operation that can fail returns an empty text, or what hinders it: a sentence without its full stop,
// for the caller to tell. A command owns it, for one run.
class ToolFolder {
  public:
    // `names` are the data files that are locked and backed up together. `operations` must outlive the object
    // and the files that it opens.
    explicit ToolFolder(std::string folder,
                        std::vector<std::string> names = DailyBackup::FilesKeptWith(InvestmentFile.name),
                        FileOperations& operations = SystemFiles())
        : folder_(std::move(folder)), names_(std::move(names)), operations_(operations) {}

    [[nodiscard]] const std::string& Path() const { return folder_; }
    [[nodiscard]] std::string PathOf(const DataFileKind& file) const;

    // Whether there is such a folder. Lock and Open ask that first.
    [[nodiscard]] std::string WhyNotThere() const;
    // Keeps other programs out of the folder, and of those in which the files really lie.
    [[nodiscard]] std::string Lock();
    // Makes sure of today's backups.
    [[nodiscard]] std::string KeepBackup();

    // Opens a file; null, with `wrong` the reason, when it cannot be used. To be changed it must be writable
    // and whole, and what an interrupted compaction has left is put right first. A damaged one can be looked
    // at all the same, and `wrong` says so.
    [[nodiscard]] std::unique_ptr<DATABASE> Open(const DataFileKind& file, DataFileUse use,
                                                 std::string& wrong) const;

    // Whether the portfolio is listed in its open file. With AnyCase `name` becomes what is written there.
    enum class Letters { Exact, AnyCase };
    [[nodiscard]] std::string FindPortfolio(DATABASE& portfolios, std::string& name, Letters letters) const;

  private:
    std::string folder_;
    std::vector<std::string> names_;
    FileOperations& operations_;
    std::list<FolderLock> locks_;
};
