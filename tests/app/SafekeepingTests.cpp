// The day's backups, and what is said about data files at start.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

#include "DataFolder.h"
#include "InChild.h"
#include "app/BackedUpFiles.h"
#include "app/DailyBackup.h"
#include "app/DataFileOpening.h"
#include "app/ReadOnlyFiles.h"
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
        folder_.AddInvestment(MakeInvestment("A", "first"));
        // Longer than what is copied at a time.
        DATABASE invest(folder_.File("invest.db").c_str());
        const INVESTMENT_DATA record = MakeInvestment("A", "another");
        for (int i = 0; i < 1500; ++i)
            invest.Append(&record);
    }
    [[nodiscard]] std::unique_ptr<DailyBackup> MakeBackup(FileOperations& files = SystemFiles()) const {
        return std::make_unique<DailyBackup>(folder_.Path(), Names{"portfol.db", "invest.db"}, files,
                                             [] { return now_; });
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
    std::filesystem::permissions(folder_.File("invest.db"), std::filesystem::perms{0640});
    const auto backup = MakeBackup();
    BackedUpFiles files(*backup);
    DATABASE invest(folder_.File("invest.db").c_str(), files);
    backup->Prepare();
    for (const int day : {22, 23, 25}) {
        SetDay(day);
        const std::string date = ".2026-11-" + std::to_string(day);
        const std::string before = folder_.Read("invest.db");
        for (long record = day; record < day + 3; ++record)
            ASSERT_EQ(invest.Delete(record), 0);
        EXPECT_NE(folder_.Read("invest.db"), before);
        EXPECT_TRUE(folder_.Read("backups/invest.db" + date) == before) << date;
        EXPECT_TRUE(folder_.Read("backups/portfol.db" + date) == folder_.Read("portfol.db")) << date;
        ASSERT_EQ(invest.UnDelete(day), 0);
        ASSERT_EQ(invest.UnDelete(day + 1), 0);
        ASSERT_EQ(invest.UnDelete(day + 2), 0);
        // As after a new start on that day.
        EXPECT_EQ(MakeBackup()->Keep(), 0);
        EXPECT_TRUE(folder_.Read("backups/invest.db" + date) == before) << date;
    }
    EXPECT_EQ(Kept(), (Names{"invest.db.2026-11-22", "invest.db.2026-11-23", "invest.db.2026-11-25",
                             "portfol.db.2026-11-22", "portfol.db.2026-11-23", "portfol.db.2026-11-25"}));
    EXPECT_EQ(std::filesystem::status(folder_.File("backups/invest.db.2026-11-23")).permissions(),
              std::filesystem::perms{0640});
}

TEST_F(BackupTest, WithoutAChangeThereIsNone) {
    {
        const auto backup = MakeBackup();
        BackedUpFiles files(*backup);
        DATABASE invest(folder_.File("invest.db").c_str(), files);
        backup->Prepare();
        EXPECT_EQ(invest.Query("Name = first", QueryMode::New), 1);
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
    const Names others = {"invest.db.2019-13-01",
                          "invest.db.2019-02-30",
                          "invest.db.2019-01-01.txt",
                          "invest.db.2019-1-01",
                          "other.db.2019-01-01",
                          "ainvest.db.2019-01-01",
                          "invest.db",
                          "notes"};
    Names expected = others;
    for (const std::string& name : others)
        folder_.Write("backups/" + name, "mine");
    for (const char* day : {"2019-12-31", "2024-02-29", "2026-11-01", "2026-11-02", "2026-11-03",
                            "2026-11-04", "2026-11-05", "2026-11-06", "2999-01-01"})
        folder_.Write(std::string("backups/invest.db.") + day, "old");
    EXPECT_EQ(MakeBackup()->Keep(), 0);
    for (const char* day :
         {"2026-11-02", "2026-11-03", "2026-11-04", "2026-11-05", "2026-11-06", "2026-11-22", "2999-01-01"})
        expected.push_back(std::string("invest.db.") + day);
    expected.emplace_back("portfol.db.2026-11-22");
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
    EXPECT_EQ(invest.Delete(0), 0);
    EXPECT_EQ(invest.Delete(1), 0);
    EXPECT_EQ(backup->Keep(), ENOTDIR);
    EXPECT_EQ(told, std::vector<int>{ENOTDIR});
    SetDay(23);
    EXPECT_EQ(invest.Delete(2), 0);
    EXPECT_EQ(told, (std::vector<int>{ENOTDIR, ENOTDIR}));
    EXPECT_EQ(folder_.Read("backups"), "in the way");
    std::filesystem::remove(folder_.File("backups"));
    SetDay(24);
    EXPECT_EQ(invest.Delete(3), 0);
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
            const Names kept = Kept();
            const bool killed = result == -1;
            for (const std::string& name : kept) {
                const bool part = name.ends_with(".part");
                EXPECT_TRUE(part ? killed || fault == Fault::Broken
                                 : complete("invest.db", invest) || complete("portfol.db", portfol))
                    << name << " after call " << at;
            }
            const bool both = complete("invest.db", invest) && complete("portfol.db", portfol);
            EXPECT_TRUE(both || result != 0) << "call " << at;
            EXPECT_EQ(MakeBackup()->Keep(), 0);
            EXPECT_TRUE(complete("invest.db", invest) && complete("portfol.db", portfol)) << "call " << at;
            EXPECT_EQ(Kept().size(), 2U) << "call " << at;
        }
    }
    EXPECT_EQ(folder_.Read("invest.db"), invest);
}

bool HoldsAnything(DATABASE& /*database*/) {
    return true;
}

TEST(DataFileOpening, SaysWhatIsWrongByName) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("A", "first"));
    const std::string whole = folder.Read("invest.db");
    const std::string path = folder.File("invest.db");
    ReadOnlyFiles readOnly;
    const auto noneOfOurs = [](DATABASE&) { return false; };
    const struct {
        const char* what;
        std::function<void()> spoil;
        bool (*holds)(DATABASE&);
        FileOperations& operations;
        bool opens;
        std::string said;
    } cases[] = {
        {"sound", [] {}, HoldsAnything, SystemFiles(), true, ""},
        {"missing", [&] { std::filesystem::remove(path); }, HoldsAnything, SystemFiles(), false,
         "invest.db is missing. \"quorvan-cli setup " + folder.Path() + "\" makes a new one.\n"},
        {"its backup cannot be put back", [&] { std::filesystem::rename(path, folder.File("invest.bak")); },
         HoldsAnything, readOnly, false,
         "invest.db is missing, but its backup with the extension .bak is there.\n"},
        {"a folder",
         [&] {
             std::filesystem::remove(path);
             std::filesystem::create_directory(path);
         },
         HoldsAnything, SystemFiles(), false, "invest.db cannot be opened: it is no file.\n"},
        {"text", [&] { folder.Write("invest.db", "hello"); }, HoldsAnything, SystemFiles(), false,
         "invest.db is no data file, or its beginning is damaged. It is left as it is.\n"},
        {"another layout", [] {}, noneOfOurs, SystemFiles(), false,
         "invest.db holds other records than Quorvan's. It is left as it is.\n"},
        {"cut off", [&] { folder.Write("invest.db", whole.substr(0, whole.size() - 5)); }, HoldsAnything,
         SystemFiles(), true,
         "invest.db is damaged: what can be read of it is shown. \"quorvan-cli db " + path +
             " check\" tells what is wrong.\n"},
        {"read-only", [] {}, HoldsAnything, readOnly, true,
         "invest.db cannot be written: Read-only file system. What you change in it will not be kept.\n"},
    };
    for (const auto& each : cases) {
        std::filesystem::remove_all(path);
        std::filesystem::remove(folder.File("invest.bak"));
        folder.Write("invest.db", whole);
        each.spoil();
        std::string said;
        const auto database =
            OpenDataFile(folder.Path(), "invest.db", each.holds, DataFileUse::Change, each.operations, said);
        EXPECT_EQ(said, each.said) << each.what;
        EXPECT_EQ(database->IsOpen(), each.opens) << each.what;
        EXPECT_EQ(database->IsOpen() && database->IsReadOnly(), std::string(each.what) == "read-only");
    }
    // Who only looks need not know that the file cannot be written.
    folder.Write("invest.db", whole);
    std::string said;
    const auto looked =
        OpenDataFile(folder.Path(), "invest.db", HoldsAnything, DataFileUse::Look, readOnly, said);
    EXPECT_EQ(said, "");
    EXPECT_NE(looked->Delete(0), 0);
    EXPECT_NE(looked->Compress(0), 0);
    EXPECT_EQ(folder.Read("invest.db"), whole);
}

} // namespace
