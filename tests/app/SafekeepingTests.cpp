// The day's backups, and what is said about data files at start.
#include <thread>

#include "DataFolder.h"
#include "InChild.h"
#include "app/model/DailyBackup.h"
#include "app/model/DataFileOpening.h"
#include "app/model/PortfolioRules.h"
#include "db/FaultyFiles.h"

namespace {

using Names = std::vector<std::string>;

std::time_t gNow = 0;

// Noon of a day of November 2026.
void SetDay(int day) {
    std::tm noon{0, 0, 12, day, 10, 2026 - 1900, 0, 0, -1, 0, nullptr};
    gNow = std::mktime(&noon);
}

class BackupTest : public testing::Test {
  protected:
    BackupTest() {
        SetDay(22);
        folder_.AddPortfolio("A");
        // Longer than what is copied at a time.
        DATABASE invest(folder_.File("invest.db").c_str());
        const INVESTMENT_DATA record = MakeInvestment("A", "first");
        for (int i = 0; i < 1501; ++i)
            invest.Append(&record);
    }
    [[nodiscard]] std::unique_ptr<DailyBackup> MakeBackup(FileOperations& files = SystemFiles()) const {
        return std::make_unique<DailyBackup>(
            folder_.Path(), Names{"portfol.db", "invest.db"}, files, [] { return gNow; });
    }
    [[nodiscard]] Names Kept() const { return folder_.Names("backups"); }

    DataFolder folder_;
    std::unique_ptr<DailyBackup> backup_ = MakeBackup();
    BackedUpFiles files_{*backup_};
};

TEST_F(BackupTest, TheFirstChangeOfADayKeepsWhatTheFilesHeld) {
    DATABASE invest(folder_.File("invest.db").c_str(), files_);
    backup_->Prepare();
    EXPECT_EQ(invest.Query("Name = first", QueryMode::New), 1501);
    EXPECT_EQ(invest.Compress(0), 0); // which drops nothing
    for (const int day : {22, 23, 25}) {
        SetDay(day);
        const std::string date = ".2026-11-" + std::to_string(day);
        const std::string before = folder_.Read("invest.db");
        for (long record = 3 * day; record < 3 * day + 3; ++record)
            ASSERT_EQ(invest.Delete(record), 0);
        EXPECT_EQ(MakeBackup()->Keep(), 0); // as after a new start on that day
        EXPECT_TRUE(folder_.Read("backups/invest.db" + date) == before) << date;
        EXPECT_TRUE(folder_.Read("backups/portfol.db" + date) == folder_.Read("portfol.db")) << date;
    }
    SetDay(26);
    auto unneeded = MakeBackup();
    unneeded->Prepare();
    while (Kept().size() < 8) // the first is copied
        std::this_thread::yield();
    unneeded.reset();
    EXPECT_EQ(Kept().size(), 6U);
}

TEST_F(BackupTest, TheOldestGoAndNothingElse) {
    std::filesystem::create_directory(folder_.File("backups"));
    Names expected = {"ainvest.db.2019-01-01",    "invest.db",
                      "invest.db.2019-01-01.txt", "invest.db.2019-02-30",
                      "invest.db.2019-1-01",      "invest.db.2026-11-02",
                      "invest.db.2026-11-03",     "invest.db.2026-11-04",
                      "invest.db.2026-11-05",     "invest.db.2026-11-06",
                      "invest.db.2999-01-01",     "other.db.2019-01-01"};
    for (const std::string& kept : expected)
        folder_.Write("backups/" + kept, "mine");
    for (const std::string day : {"2019-12-31", "2024-02-29", "2026-11-01"})
        folder_.Write("backups/invest.db." + day, "old");
    EXPECT_EQ(DailyBackup::FilesKeptWith("portfol.db"), DailyBackup::FilesKeptWith("invest.db"));
    std::filesystem::remove(folder_.File("portfol.db")); // the other is kept alone
    EXPECT_EQ(MakeBackup()->Keep(), 0);
    expected.insert(expected.end() - 2, "invest.db.2026-11-22"); // one of seven
    EXPECT_EQ(Kept(), expected);
}

TEST_F(BackupTest, AFailureIsToldOnceADayAndTheChangeIsMade) {
    folder_.Write("backups", "in the way");
    std::vector<int> told;
    backup_->OnFailure([&](int error) { told.push_back(error); });
    backup_->Prepare();
    DATABASE invest(folder_.File("invest.db").c_str(), files_);
    for (const int day : {22, 22, 23, 24}) {
        SetDay(day);
        if (day == 24)
            std::filesystem::remove(folder_.File("backups"));
        EXPECT_EQ(invest.Delete(std::ssize(told) + day), 0);
        EXPECT_EQ(backup_->Keep(), day == 24 ? 0 : ENOTDIR);
    }
    EXPECT_EQ(told, (std::vector{ENOTDIR, ENOTDIR}));
    EXPECT_EQ(Kept().size(), 2U);
}

// Whichever call fails, and wherever the process is killed: a backup is complete or not there, and what stays
// undone is said.
TEST_F(BackupTest, IsCompleteOrAbsentWhateverFails) {
    const auto complete = [&](const std::string& name) {
        return folder_.Read("backups/" + name + ".2026-11-22") == folder_.Read(name);
    };
    for (const Fault fault : {Fault::Error, Fault::HalfThenError, Fault::ShortWrite, Fault::Broken,
                              Fault::Interrupted, Fault::KilledBefore, Fault::KilledAfter}) {
        int result = 0;
        for (int at = 0; result != 200; ++at) {
            ASSERT_LT(at, 100);
            std::filesystem::remove_all(folder_.File("backups"));
            result = ResultInChild([&] {
                FaultyFiles files;
                const auto backup = MakeBackup(files);
                files.Arm(fault, at);
                const int error = backup->Keep();
                return files.Disarm() ? error : 200;
            });
            for (const std::string& name : Kept())
                EXPECT_TRUE(name.ends_with(".part") ? result == -1 || fault == Fault::Broken
                                                    : complete(name.substr(0, name.rfind('.'))))
                    << name << " after call " << at;
            EXPECT_TRUE(Kept().size() == 2 || result != 0) << "call " << at;
            EXPECT_EQ(MakeBackup()->Keep(), 0);
            EXPECT_TRUE(complete("invest.db") && complete("portfol.db") && Kept().size() == 2)
                << "call " << at;
        }
    }
}

TEST(DataFileOpening, SaysWhatIsWrongByName) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("A", "first"));
    const std::string whole = folder.Read("invest.db");
    const std::string cli = "\"quorvan-cli db " + folder.File("invest.db") + " check";
    ReadOnlyFiles readOnly;
    FileOperations& usual = SystemFiles();
    const auto leftover = [&](const std::string& name) {
        return "is missing, but " + folder.File(name) +
               " is there, as an interrupted compaction leaves it. " + cli +
               " --repair\" gives it the file's name.\n";
    };
    const std::string missing = "is missing. \"quorvan-cli setup " + folder.Path() + "\" makes a new one.\n";
    const std::string unknown = "is no data file, or its beginning is damaged. It is left as it is.\n";
    const std::string part =
        "is damaged: what can be read of it is shown. " + cli + "\" tells what is wrong.\n";
    const std::string protectedFile =
        "cannot be written: Read-only file system. What you change in it will not be kept.\n";
    // A file, what is in it, what is said of it, and whether it opens.
    const std::tuple<const char*, std::string, std::string, bool, FileOperations&> cases[] = {
        {"other", whole, missing, false, usual},
        {"invest.bak", whole, leftover("invest.bak"), false, readOnly},
        {"invest.bak", whole, "", true, usual},
        {"invest.new", whole, leftover("invest.new"), false, usual},
        {"invest.db/file", whole, "cannot be opened: it is no file.\n", false, usual},
        {"invest.db", "", unknown, false, usual},
        {"invest.db", whole.substr(0, whole.size() - 5), part, true, usual},
        {"invest.db", folder.Read("misc.db"), "holds other records than Quorvan's. It is left as it is.\n",
         false, usual},
        {"invest.db", whole, protectedFile, true, readOnly},
        {"invest.db", whole, "", true, usual},
    };
    for (const auto& [file, content, sentence, opens, operations] : cases) {
        folder.Clear();
        std::filesystem::create_directories(std::filesystem::path(folder.File(file)).parent_path());
        folder.Write(file, content);
        std::string said;
        const auto database =
            OpenDataFile(folder.Path(), "invest.db", HoldsInvestments, DataFileUse::Change, operations, said);
        EXPECT_EQ(said, sentence.empty() ? "" : "invest.db " + sentence);
        EXPECT_EQ(database->IsOpen(), opens) << sentence;
    }
}

} // namespace
