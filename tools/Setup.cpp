#include "tools/Setup.h"

#include <cerrno>
#include <filesystem>
#include <functional>
#include <list>
#include <ostream>
#include <span>
#include <string_view>
#include <sys/stat.h>
#include <system_error>
#include <utility>

#include "app/model/DataFolders.h"
#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "tools/DesktopFiles.h"
#include "tools/FirstFiles.h"
#include "tools/Sentences.h"
#include "util/File.h"
#include "util/Strings.h"

namespace {

namespace fs = std::filesystem;

constexpr std::size_t MaxProgramSize = std::size_t{1} << 30U;

// What is made here is the person's alone, whatever the mask: it tells what the person owns.
constexpr mode_t PrivateFile = 0600;
constexpr mode_t PrivateProgram = 0700;
constexpr mode_t PrivateFolder = 0700;

// Makes the folder, and those above it that are missing. Returns 0, also when it is there, or an errno
// number.
int MakeFolders(const fs::path& path) {
    if (mkdir(path.c_str(), PrivateFolder) == 0)
        return 0;
    std::error_code ignored;
    if (errno == EEXIST)
        return fs::is_directory(path, ignored) ? 0 : ENOTDIR;
    if (errno != ENOENT)
        return errno;
    if (const int error = MakeFolders(path.parent_path()); error != 0)
        return error;
    return mkdir(path.c_str(), PrivateFolder) == 0 ? 0 : errno;
}

struct DataFilePlan {
    const char* stem; // the file's name without its extension
    const char* description;
    std::span<const COLUMN_ENTRY> columns;
    std::function<bool(DATABASE&)> fill;
    const char* content;
};

class FolderSetup {
  public:
    FolderSetup(const SetupOptions& options, std::ostream& output, std::ostream& errors)
        : options_(options), output_(output), errors_(errors) {}

    int Run();
    int RemoveFromDesktop();

  private:
    bool FindFolder();
    // `words` begin the sentence of its failure.
    bool MakeFolder(const char* words, const std::string& path);
    bool TakeFolder();
    void MakeDataFiles();
    // Prepares all of the files before the first takes its name, and makes none when one fails: investments
    // without their portfolios would be no sample.
    void MakeTogether(std::span<const DataFilePlan> plans);
    bool PrepareDataFile(const DataFilePlan& plan);
    void MakeFile(const std::string& name, std::string_view content);
    void MakeHelp();
    // A part of the help, which belongs to the program's version: replaced together with the program.
    void MakeHelpFile(const std::string& name, std::string_view content);
    // Copies the program of that name from where it lies, empty when it was not found.
    void InstallProgram(const std::string& name, const std::string& from);
    bool HasDataFolder();
    void AddToDesktop();

    // Writes the file of that name, in the place of one that is there only when `existing` says so.
    void Write(const std::string& name, std::string_view content, mode_t mode, ExistingFile existing,
               const std::string& remark = "");
    // The outcome of a step that ends with a file of that name: 0 or an errno number.
    void Conclude(int error, const std::string& name, const std::string& remark);
    void Made(const std::string& name, const std::string& remark);
    void Kept(const std::string& name, const std::string& remark);
    void Fail(const std::string& sentence);

    // The name under which the data file's data is there, which an interrupted compaction may have left in
    // another place; empty for none.
    [[nodiscard]] std::string Present(const std::string& stem) const;
    [[nodiscard]] static std::string FileOf(const std::string& stem) { return stem + ".db"; }
    [[nodiscard]] std::string PathOf(const std::string& name) const { return folder_ + "/" + name; }
    [[nodiscard]] std::string TemporaryFor(const std::string& name) const { return PathOf(name) + ".part"; }

    const SetupOptions& options_;
    std::ostream& output_;
    std::ostream& errors_;
    std::string folder_;
    std::list<FolderLock> locks_;
    bool failed_ = false;
};

void FolderSetup::Made(const std::string& name, const std::string& remark) {
    output_ << "made  " << name << (remark.empty() ? "" : ": ") << remark << '\n';
}

void FolderSetup::Kept(const std::string& name, const std::string& remark) {
    output_ << "kept  " << name << (remark.empty() ? "" : ": ") << remark << '\n';
}

void FolderSetup::Fail(const std::string& sentence) {
    errors_ << "quorvan-cli: " << sentence << '\n';
    failed_ = true;
}

void FolderSetup::Write(const std::string& name, std::string_view content, mode_t mode, ExistingFile existing,
                        const std::string& remark) {
    Conclude(WriteWholeFile(PathOf(name), TemporaryFor(name), content, mode, existing), name, remark);
}

void FolderSetup::Conclude(int error, const std::string& name, const std::string& remark) {
    if (error == 0)
        Made(name, remark);
    else if (error == EEXIST)
        Kept(name, "");
    else
        Fail(PathOf(name) + " cannot be made: " + Reason(error) + ".");
}

bool FolderSetup::FindFolder() {
    std::error_code error;
    const fs::path wanted = options_.folder.empty()
                                ? fs::path()
                                : fs::weakly_canonical(fs::absolute(options_.folder, error), error);
    std::string path = wanted.string();
    while (path.size() > 1 && path.back() == '/')
        path.pop_back();
    if (path.empty()) {
        Fail("The folder '" + options_.folder +
             "' cannot be used: " + (error ? error.message() : std::string("the name is empty")) + ".");
        return false;
    }
    if (path.size() > MaxFolderLength) {
        Fail("The folder's path is too long: " + path + " has " + std::to_string(path.size()) +
             " bytes, and Quorvan's files need one of at most " + std::to_string(MaxFolderLength) + ".");
        return false;
    }
    folder_ = path;
    return true;
}

bool FolderSetup::TakeFolder() {
    const auto goesOn = [this](const FolderLock& lock, const std::string& folder,
                               FolderLock::Outcome outcome) {
        const std::string use = UseOf(lock, folder, outcome);
        if (!use.empty())
            Fail("The folder " + folder + use +
                 (outcome == FolderLock::Outcome::Held ? "; close that program first." : "."));
        // Where the lock cannot be made nothing else can: what is missing is told file by file.
        return use.empty();
    };
    return TakeFolders(locks_, folder_, {}, ToolName, goesOn);
}

bool FolderSetup::MakeFolder(const char* words, const std::string& path) {
    const int error = MakeFolders(path);
    if (error != 0)
        Fail(words + path + " cannot be made: " + Reason(error) + ".");
    return error == 0;
}

bool FolderSetup::PrepareDataFile(const DataFilePlan& plan) {
    const std::string name = FileOf(plan.stem);
    const std::string temporary = TemporaryFor(name);
    static_cast<void>(RemoveFile(SystemFiles(), temporary));
    std::vector<COLUMN_ENTRY> columns(plan.columns.begin(), plan.columns.end());
    DATABASE database(nullptr);
    if (database.Create(temporary.c_str(), plan.description, static_cast<int>(columns.size()),
                        columns.data()) == 0 &&
        (!plan.fill || plan.fill(database)) && database.Sync() == 0)
        return true;
    const int error = errno;
    char message[128] = "";
    database.GetLastError(message);
    static_cast<void>(RemoveFile(SystemFiles(), temporary));
    Fail(PathOf(name) + " cannot be made: " + message + (error != 0 ? " (" + Reason(error) + ")." : "."));
    return false;
}

std::string FolderSetup::Present(const std::string& stem) const {
    std::string name = FileOf(stem);
    return FileExists(PathOf(name)) ? name
                                    : fs::path(FindCompactionLeftover(PathOf(name))).filename().string();
}

void FolderSetup::MakeTogether(std::span<const DataFilePlan> plans) {
    bool prepared = true;
    for (const DataFilePlan& plan : plans)
        prepared = prepared && (!Present(plan.stem).empty() || PrepareDataFile(plan));
    for (const DataFilePlan& plan : plans) {
        const std::string name = FileOf(plan.stem);
        if (const std::string present = Present(plan.stem); !present.empty())
            Kept(present, "");
        else if (prepared)
            Conclude(MoveWithoutReplacing(TemporaryFor(name), PathOf(name)), name, plan.content);
        static_cast<void>(RemoveFile(SystemFiles(), TemporaryFor(name)));
    }
}

void FolderSetup::MakeDataFiles() {
    const bool sample = options_.sample && Present("portfol").empty() && Present("invest").empty();
    const DataFilePlan empty[] = {
        {"invest", "Quorvan investments", InvestmentColumns, {}, "empty"},
        {"portfol", "Quorvan portfolios", PortfolioColumns, {}, "empty"},
    };
    const DataFilePlan sampled[] = {
        {"invest", "Quorvan investments", InvestmentColumns, AppendSampleInvestments, "sample investments"},
        {"portfol", "Quorvan portfolios", PortfolioColumns, AppendSamplePortfolios, "sample portfolios"},
    };
    const DataFilePlan pickLists[] = {
        {"misc", "Quorvan pick lists", CategoryColumns, AppendPickLists, "entries for Type and Agent"},
    };
    MakeTogether(sample ? sampled : empty);
    MakeTogether(pickLists);
    for (const std::string& name : {PathOf(FileOf("invest")), folder_})
        if (const int error = SyncFolderOf(SystemFiles(), name); error != 0)
            Fail("The name of " + name + " cannot be brought to the disk: " + Reason(error) + ".");
    if (options_.sample && !sample)
        output_ << "no sample is added: it goes into new data files only\n";
}

void FolderSetup::MakeFile(const std::string& name, std::string_view content) {
    if (FileExists(PathOf(name)))
        Kept(name, "");
    else
        Write(name, content, PrivateFile, ExistingFile::Keep);
}

void FolderSetup::InstallProgram(const std::string& name, const std::string& from) {
    const bool there = FileExists(PathOf(name));
    std::string content;
    std::string present;
    if (from.empty())
        if (there)
            Kept(name, "");
        else
            Fail("The program " + name + " was not found beside quorvan-cli; name it with --program FILE.");
    else if (const int error = ReadWholeFile(from, content, MaxProgramSize); error != 0)
        Fail("The program " + from + " cannot be read: " + Reason(error) + ".");
    else if (there && ReadWholeFile(PathOf(name), present, MaxProgramSize) == 0 && present == content)
        Kept(name, "");
    else if (!there || options_.updateProgram)
        Write(name, content, PrivateProgram, there ? ExistingFile::Replace : ExistingFile::Keep,
              "copied from " + from);
    else
        Kept(name, "it differs from " + from + "; --update-program replaces it");
}

bool FolderSetup::HasDataFolder() {
    if (options_.dataFolder.empty())
        Fail("There is no home folder, so the desktop keeps no programs for you.");
    return !options_.dataFolder.empty();
}

void FolderSetup::AddToDesktop() {
    if (!HasDataFolder() || !InstallDesktopFiles(PathOf("quorvan"), options_.dataFolder, output_, errors_))
        failed_ = true;
}

int FolderSetup::RemoveFromDesktop() {
    return FindFolder() && HasDataFolder() &&
                   RemoveDesktopFiles(PathOf("quorvan"), options_.dataFolder, output_, errors_)
               ? 0
               : 1;
}

void FolderSetup::MakeHelpFile(const std::string& name, std::string_view content) {
    std::string present;
    if (!FileExists(PathOf(name)) || !options_.updateProgram)
        MakeFile(name, content);
    else if (ReadWholeFile(PathOf(name), present, content.size()) == 0 && present == content)
        Kept(name, "");
    else
        Write(name, content, PrivateFile, ExistingFile::Replace, "brought up to date");
}

void FolderSetup::MakeHelp() {
    if (!MakeFolder("", PathOf("help")))
        return;
    MakeHelpFile("help/Quorvan.html", HelpDocument());
    if (!MakeFolder("", PathOf("help/pictures")))
        return;
    for (const EmbeddedFile& picture : HelpPictures())
        MakeHelpFile(std::string("help/pictures/") + picture.name, picture.content);
}

int FolderSetup::Run() {
    if (!FindFolder() || !MakeFolder("The folder ", folder_) || !TakeFolder())
        return 1;
    output_ << "Quorvan folder " << folder_ << '\n';
    MakeDataFiles();
    MakeFile("Quorvan.ini", FirstSettings());
    MakeFile("Quorvan.cfg", FirstQuoteSources());
    MakeHelp();
    InstallProgram("quorvan-cli", options_.companion);
    // The version of the program tells the launcher whether all the rest is up to date, so it comes last.
    if (failed_ && FileExists(PathOf("quorvan")))
        Kept("quorvan", "until all before it can be made");
    else
        InstallProgram("quorvan", options_.program);
    if (options_.desktop && !failed_)
        AddToDesktop();
    return failed_ ? 1 : 0;
}

} // namespace

int RunSetup(const SetupOptions& options, std::ostream& output, std::ostream& errors) {
    return FolderSetup(options, output, errors).Run();
}

int RunDesktopRemoval(const SetupOptions& options, std::ostream& output, std::ostream& errors) {
    return FolderSetup(options, output, errors).RemoveFromDesktop();
}
