// The day's backups, and what is said about data files at start.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

#include "DataFolder.h"
#include "InChild.h"
#include "app/model/DailyBackup.h"
#include "app/model/DataFileOpening.h"
#include "db/FaultyFiles.h"

namespace {

using Names = std::vector<std::string>;

std::time_t now_ = 0;

// Noon of a day of November 2026.
void SetDay(int day) {
    std::tm noon{0, 0, 12, day, 10, 2026 - 1900, 0, 0, -1, 0, nullptr};
    now_ = std::mktime(&noon);
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
            folder_.Path(), Names{"portfol.db", "invest.db"}, files, [] { return now_; });
    }
    [[nodiscard]] Names Kept() const {
        Names names;
        std::error_code none;
        for (const auto& entry : std::filesystem::directory_iterator(folder_.File("backups"), none))
            names.push_back(entry.path().filename());
        std::sort(names.begin(), names.end());
        return names;
    }

    DataFolder folder_;
    std::unique_ptr<DailyBackup> backup_ = MakeBackup();
    BackedUpFiles files_{*backup_};
};

TEST_F(BackupTest, TheFirstChangeOfADayKeepsWhatTheFilesHeld) {
    std::filesystem::permissions(folder_.File("invest.db"), std::filesystem::perms{0664}); // a group's
    DATABASE invest(folder_.File("invest.db").c_str(), files_);
    backup_->Prepare();
    for (const int day : {22, 23, 25}) {
        SetDay(day);
        const std::string date = ".2026-11-" + std::to_string(day);
        const std::string before = folder_.Read("invest.db");
        for (long record = 3 * day; record < 3 * day + 3; ++record)
            ASSERT_EQ(invest.Delete(record), 0);
        EXPECT_EQ(MakeBackup()->Keep(), 0); // as after a new start on that day
        EXPECT_TRUE(folder_.Read("backups/invest.db" + date) == before) << date;
        EXPECT_TRUE(folder_.Read("backups/portfol.db" + date) == folder_.Read("portfol.db")) << date;
        EXPECT_EQ(std::filesystem::status(folder_.File("backups/invest.db" + date)).permissions(),
                  std::filesystem::perms{0660});
    }
    EXPECT_EQ(Kept().size(), 6U);
}

TEST_F(BackupTest, WithoutAChangeThereIsNone) {
    {
        DATABASE invest(folder_.File("invest.db").c_str(), files_);
        backup_->Prepare();
        EXPECT_EQ(invest.Query("Name = first", QueryMode::New), 1501);
        EXPECT_EQ(invest.Compress(0), 0);
    }
    backup_.reset();
    EXPECT_EQ(Kept(), Names{});
}

TEST_F(BackupTest, AFileWithoutOthersIsKeptAlone) {
    EXPECT_EQ(DailyBackup::FilesKeptWith("portfol.db"), DailyBackup::FilesKeptWith("invest.db"));
    EXPECT_EQ(DailyBackup::FilesKeptWith("misc.db"), Names{"misc.db"});
    std::filesystem::remove(folder_.File("portfol.db"));
    EXPECT_EQ(MakeBackup()->Keep(), 0);
    EXPECT_EQ(Kept(), Names{"invest.db.2026-11-22"});
}

TEST_F(BackupTest, TheOldestGoAndNothingElse) {
    std::filesystem::create_directory(folder_.File("backups"));
    Names expected = {"ainvest.db.2019-01-01", "invest.db",           "invest.db.2019-01-01.txt",
                      "invest.db.2019-02-30",  "invest.db.2019-1-01", "other.db.2019-01-01"};
    for (const std::string& other : expected)
        folder_.Write("backups/" + other, "mine");
    int count = 0;
    for (const char* day : {"2019-12-31", "2024-02-29", "2026-11-01", "2026-11-02", "2026-11-03",
                            "2026-11-04", "2026-11-05", "2026-11-06", "2999-01-01"}) {
        folder_.Write(std::string("backups/invest.db.") + day, "old");
        if (++count > 3) // with today's there are seven
            expected.push_back(std::string("invest.db.") + day);
    }
    EXPECT_EQ(MakeBackup()->Keep(), 0);
    expected.insert(expected.end(), {"invest.db.2026-11-22", "portfol.db.2026-11-22"});
    std::sort(expected.begin(), expected.end());
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
    const std::string invest = folder_.Read("invest.db");
    const std::string portfol = folder_.Read("portfol.db");
    const auto complete = [&](const std::string& name, const std::string& content) {
        return folder_.Read("backups/" + name + ".2026-11-22") == content;
    };
    const auto both = [&] { return complete("invest.db", invest) && complete("portfol.db", portfol); };
    const auto keep = [&](Fault fault, int at) {
        FaultyFiles files;
        const auto backup = MakeBackup(files);
        files.Arm(fault, at);
        const int error = backup->Keep();
        return !files.Disarm() ? 200 : error;
    };
    for (const Fault fault : {Fault::Error, Fault::HalfThenError, Fault::ShortWrite, Fault::Broken,
                              Fault::Interrupted, Fault::KilledBefore, Fault::KilledAfter}) {
        int result = 0;
        for (int at = 0; result != 200; ++at) {
            ASSERT_LT(at, 100);
            std::filesystem::remove_all(folder_.File("backups"));
            result = ResultInChild([&] { return keep(fault, at); });
            for (const std::string& name : Kept())
                EXPECT_TRUE(name.ends_with(".part")
                                ? result == -1 || fault == Fault::Broken
                                : complete("invest.db", invest) || complete("portfol.db", portfol))
                    << name << " after call " << at;
            EXPECT_TRUE(both() || result != 0) << "call " << at;
            EXPECT_EQ(MakeBackup()->Keep(), 0);
            EXPECT_TRUE(both() && Kept().size() == 2) << "call " << at;
        }
    }
}

TEST(DataFileOpening, SaysWhatIsWrongByName) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("A", "first"));
    const std::string whole = folder.Read("invest.db");
    const std::string path = folder.File("invest.db");
    ReadOnlyFiles readOnly;
    const auto leftover = [&](const char* extension) {
        return "is missing, but " + folder.File("invest") + extension +
               " is there, as an interrupted compaction leaves it. \"quorvan-cli db " + path +
               " check --repair\" gives it the file's name.\n";
    };
    const std::string unknown = "is no data file, or its beginning is damaged. It is left as it is.\n";
    const struct {
        const char* file;
        std::string content, said;
        bool opens = false;
        FileOperations& operations = SystemFiles();
        bool (*holds)(DATABASE&) = [](DATABASE&) { return true; };
    } cases[] = {
        {"other", whole, "is missing. \"quorvan-cli setup " + folder.Path() + "\" makes a new one.\n"},
        {"invest.bak", whole, leftover(".bak"), false, readOnly},
        {"invest.bak", whole, "", true},
        {"invest.new", whole, leftover(".new")},
        {"invest.db/file", whole, "cannot be opened: it is no file.\n"},
        {"invest.db", "", unknown},
        {"invest.db", std::string(5000, 'x'), unknown},
        {"invest.db", whole.substr(0, 300), unknown},
        {"invest.db", whole.substr(0, whole.size() - 5),
         "is damaged: what can be read of it is shown. \"quorvan-cli db " + path +
             " check\" tells what is wrong.\n",
         true},
        {"invest.db", whole, "holds other records than Quorvan's. It is left as it is.\n", false,
         SystemFiles(), [](DATABASE&) { return false; }},
        {"invest.db", whole,
         "cannot be written: Read-only file system. What you change in it will not be kept.\n", true,
         readOnly},
        {"invest.db", whole, "", true},
    };
    std::string said;
    for (const auto& each : cases) {
        folder.Clear();
        std::filesystem::create_directories(std::filesystem::path(folder.File(each.file)).parent_path());
        folder.Write(each.file, each.content);
        said.clear();
        const auto database =
            OpenDataFile(folder.Path(), "invest.db", each.holds, DataFileUse::Change, each.operations, said);
        EXPECT_EQ(said, each.said.empty() ? "" : "invest.db " + each.said);
        EXPECT_EQ(database->IsOpen(), each.opens) << each.said;
    }
    // Who only looks need not know that the file cannot be written.
    said.clear();
    const auto looked = OpenDataFile(
        folder.Path(), "invest.db", [](DATABASE&) { return true; }, DataFileUse::Look, readOnly, said);
    EXPECT_EQ(said, "");
    EXPECT_NE(looked->Delete(0), 0);
    EXPECT_NE(looked->Compress(0), 0);
    EXPECT_EQ(folder.Read("invest.db"), whole);
}

} // namespace
