// The day's backups, and what is said about data files at start.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

#include "DataFolder.h"
#include "InChild.h"
#include "app/model/BackedUpFiles.h"
#include "app/model/DailyBackup.h"
#include "app/model/DataFileOpening.h"
#include "app/model/ReadOnlyFiles.h"
#include "db/FaultyFiles.h"

namespace {

using Names = std::vector<std::string>;

std::time_t now_ = 0;

// Noon of a day of November 2026.
void SetDay(int day) {
    std::tm noon{};
    noon.tm_year = 2026 - 1900;
    noon.tm_mon = 10;
    noon.tm_mday = day;
    noon.tm_hour = 12;
    noon.tm_isdst = -1;
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
};

TEST_F(BackupTest, TheFirstChangeOfADayKeepsWhatTheFilesHeld) {
    std::filesystem::permissions(folder_.File("invest.db"), std::filesystem::perms{0664}); // a group's
    const auto backup = MakeBackup();
    BackedUpFiles files(*backup);
    DATABASE invest(folder_.File("invest.db").c_str(), files);
    backup->Prepare();
    Names kept;
    for (const int day : {22, 23, 25}) {
        SetDay(day);
        const std::string date = ".2026-11-" + std::to_string(day);
        const std::string before = folder_.Read("invest.db");
        for (long record = day; record < day + 3; ++record)
            ASSERT_EQ(invest.Delete(record), 0);
        EXPECT_NE(folder_.Read("invest.db"), before);
        for (long record = day; record < day + 3; ++record)
            ASSERT_EQ(invest.UnDelete(record), 0);
        EXPECT_EQ(MakeBackup()->Keep(), 0); // as after a new start on that day
        EXPECT_TRUE(folder_.Read("backups/invest.db" + date) == before) << date;
        EXPECT_TRUE(folder_.Read("backups/portfol.db" + date) == folder_.Read("portfol.db")) << date;
        kept.insert(kept.begin() + std::ssize(kept) / 2, "invest.db" + date);
        kept.push_back("portfol.db" + date);
    }
    EXPECT_EQ(Kept(), kept);
    EXPECT_EQ(std::filesystem::status(folder_.File("backups/invest.db.2026-11-23")).permissions(),
              std::filesystem::perms{0660});
}

TEST_F(BackupTest, WithoutAChangeThereIsNone) {
    {
        const auto backup = MakeBackup();
        BackedUpFiles files(*backup);
        DATABASE invest(folder_.File("invest.db").c_str(), files);
        backup->Prepare();
        EXPECT_EQ(invest.Query("Name = first", QueryMode::New), 1501);
        EXPECT_EQ(invest.Compress(0), 0);
    }
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
    Names expected = {"ainvest.db.2019-01-01",
                      "invest.db",
                      "invest.db.2019-01-01.txt",
                      "invest.db.2019-02-30",
                      "invest.db.2019-1-01",
                      "invest.db.2019-13-01",
                      "notes",
                      "other.db.2019-01-01"};
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
    const auto backup = MakeBackup();
    std::vector<int> told;
    backup->OnFailure([&](int error) { told.push_back(error); });
    backup->Prepare();
    BackedUpFiles files(*backup);
    DATABASE invest(folder_.File("invest.db").c_str(), files);
    const auto deletesOn = [&](int day, long record) {
        SetDay(day);
        EXPECT_EQ(invest.Delete(record), 0);
    };
    deletesOn(22, 0);
    deletesOn(22, 1);
    EXPECT_EQ(backup->Keep(), ENOTDIR);
    EXPECT_EQ(told, std::vector<int>{ENOTDIR});
    deletesOn(23, 2);
    EXPECT_EQ(told, (std::vector<int>{ENOTDIR, ENOTDIR}));
    EXPECT_EQ(folder_.Read("backups"), "in the way");
    std::filesystem::remove(folder_.File("backups"));
    deletesOn(24, 3);
    EXPECT_EQ(told.size(), 2U);
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
            const bool both = complete("invest.db", invest) && complete("portfol.db", portfol);
            EXPECT_TRUE(both || result != 0) << "call " << at;
            EXPECT_EQ(MakeBackup()->Keep(), 0);
            EXPECT_TRUE(complete("invest.db", invest) && complete("portfol.db", portfol)) << "call " << at;
            EXPECT_EQ(Kept().size(), 2U) << "call " << at;
        }
    }
    EXPECT_EQ(folder_.Read("invest.db"), invest);
}

TEST(DataFileOpening, SaysWhatIsWrongByName) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("A", "first"));
    const std::string whole = folder.Read("invest.db");
    const std::string path = folder.File("invest.db");
    ReadOnlyFiles readOnly;
    const auto any = [](DATABASE&) { return true; };
    const auto noneOfOurs = [](DATABASE&) { return false; };
    const auto nothing = [] {};
    const auto leftover = [&](const char* extension) {
        return "is missing, but " + folder.File("invest") + extension +
               " is there, as an interrupted compaction leaves it. \"quorvan-cli db " + path +
               " check --repair\" gives it the file's name.\n";
    };
    const struct {
        std::string what;
        std::function<void()> spoil;
        std::string said;
        bool opens = false;
        bool (*holds)(DATABASE&) = [](DATABASE&) { return true; };
        FileOperations& operations = SystemFiles();
    } cases[] = {
        {"sound", nothing, "", true},
        {"missing", [&] { std::filesystem::remove(path); },
         "is missing. \"quorvan-cli setup " + folder.Path() + "\" makes a new one.\n"},
        {"its backup cannot be put back", [&] { std::filesystem::rename(path, folder.File("invest.bak")); },
         leftover(".bak"), false, any, readOnly},
        {"only a compaction's file", [&] { std::filesystem::rename(path, folder.File("invest.new")); },
         leftover(".new")},
        {"a folder",
         [&] {
             std::filesystem::remove(path);
             std::filesystem::create_directory(path);
         },
         "cannot be opened: it is no file.\n"},
        {"cut in its header", [&] { folder.Write("invest.db", whole.substr(0, 300)); },
         "is no data file, or its beginning is damaged. It is left as it is.\n"},
        {"another layout", nothing, "holds other records than Quorvan's. It is left as it is.\n", false,
         noneOfOurs},
        {"cut off", [&] { folder.Write("invest.db", whole.substr(0, whole.size() - 5)); },
         "is damaged: what can be read of it is shown. \"quorvan-cli db " + path +
             " check\" tells what is wrong.\n",
         true},
        {"read-only", nothing,
         "cannot be written: Read-only file system. What you change in it will not be kept.\n", true, any,
         readOnly},
    };
    for (const auto& each : cases) {
        std::filesystem::remove_all(path);
        std::filesystem::remove(folder.File("invest.bak"));
        folder.Write("invest.db", whole);
        each.spoil();
        std::string said;
        const auto database =
            OpenDataFile(folder.Path(), "invest.db", each.holds, DataFileUse::Change, each.operations, said);
        EXPECT_EQ(said, each.said.empty() ? "" : "invest.db " + each.said) << each.what;
        EXPECT_EQ(database->IsOpen(), each.opens) << each.what;
        EXPECT_EQ(database->IsOpen() && database->IsReadOnly(), each.what == "read-only");
    }
    // Who only looks need not know that the file cannot be written.
    folder.Write("invest.db", whole);
    std::string said;
    const auto looked = OpenDataFile(folder.Path(), "invest.db", any, DataFileUse::Look, readOnly, said);
    EXPECT_EQ(said, "");
    EXPECT_NE(looked->Delete(0), 0);
    EXPECT_NE(looked->Compress(0), 0);
    EXPECT_EQ(folder.Read("invest.db"), whole);
}

} // namespace
