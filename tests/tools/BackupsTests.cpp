#include "CommandTest.h"
#include "DataFolder.h"
#include "InChild.h"
#include "db/FaultyFiles.h"
#include "tools/Backups.h"
#include "util/FolderLock.h"

namespace {

const std::string Names[] = {"invest.db", "portfol.db"};
const std::string Day = "2026-11-20";

// Everything but the wait for the disk.
struct QuickFiles : FileOperations {
    int Sync(int /*file*/) override { return 0; }
};

// A folder with portfolios A and B, of which B was not there on a day whose backups are. The states are the
// bytes of the files.
class Backups : public CommandTest {
  protected:
    Backups() {
        std::filesystem::create_directory(home_.File("backups"));
        home_.AddPortfolio("A");
        for (const char* name : {"kept", "changed", "removed"})
            home_.AddInvestment(MakeInvestment("A", name));
        for (const std::string& name : Names)
            std::filesystem::copy(home_.File(name), home_.File("backups/" + name + "." + Day));
        earlier_ = State(home_);
        home_.AddPortfolio("B");
        home_.AddInvestment(MakeInvestment("B", "added"));
        DATABASE investments(home_.File("invest.db").c_str());
        const INVESTMENT_DATA changed = MakeInvestment("A", "changed", 3);
        EXPECT_EQ(investments.Write(1, &changed) + investments.Delete(2), 0);
        present_ = State(home_);
    }
    static std::vector<std::string> State(const TemporaryFolder& folder, const std::string& suffix = "") {
        return {folder.Read(Names[0] + suffix), folder.Read(Names[1] + suffix)};
    }
    std::string Command(const std::string& arguments) const {
        return "quorvan-cli backups " + arguments + " --home '" + home_.Path() + "'";
    }
    int Restore(FileOperations& files) const {
        std::string kept;
        std::vector<BackupFile> backups = FindBackups(home_.Path());
        std::erase_if(backups, [](const BackupFile& backup) { return backup.day != Day; });
        return RestoreBackups(home_.Path(), backups, &kept, files).empty() ? 0 : 1;
    }
    // What is kept besides that day.
    std::vector<std::string> OtherDays() const {
        std::vector<std::string> days;
        for (const BackupFile& backup : FindBackups(home_.Path()))
            if (backup.day != Day && (days.empty() || days.back() != backup.day))
                days.push_back(backup.day);
        return days;
    }

    DataFolder home_;
    std::vector<std::string> earlier_;
    std::vector<std::string> present_;
};

TEST_F(Backups, AreListedAndGoThereAndBack) {
    EXPECT_EQ(Printed(Command("")), "day         file        bytes  records  added  changed  removed\n"
                                    "2026-11-20  invest.db    1317        3      1        1        1\n"
                                    "2026-11-20  portfol.db    129        1      1        0        0\n");
    EXPECT_TRUE(Works(Command("--json"), R"({"day":"2026-11-20","file":"invest.db","bytes":)"));
    EXPECT_TRUE(Works("chmod 640 '" + home_.File("invest.db'; ") + Command("restore " + Day),
                      "restored invest.db, portfol.db of "));
    EXPECT_TRUE(State(home_) == earlier_);
    EXPECT_EQ(std::filesystem::status(home_.File("invest.db")).permissions(), std::filesystem::perms(0640));
    // Once more on the same day, and then back to what was there at first.
    EXPECT_TRUE(Works(Command("restore " + Day + " invest.db"), "restored invest.db of "));
    ASSERT_EQ(OtherDays().size(), 2U);
    EXPECT_TRUE(Works(Command("restore " + OtherDays()[0])));
    EXPECT_TRUE(State(home_) == present_);
    EXPECT_EQ(home_.Names(),
              (std::vector<std::string>{"Quorvan.ini", "backups", "invest.db", "misc.db", "portfol.db"}));
}

TEST_F(Backups, ThatCannotBeUsedChangeNothing) {
    std::optional<FolderLock> lock(std::in_place);
    ASSERT_EQ(lock->Take(home_.Path(), "quorvan"), FolderLock::Outcome::Taken);
    EXPECT_TRUE(folder_.Fails(Command("restore " + Day), 1, "in use by quorvan (process "));
    lock.reset();
    const std::pair<std::string, std::string> cases[] = {
        {"restore ../" + Day, "there is no backup of ../" + Day},
        {"restore ''", "there is no backup of  in "},
        {"restore " + Day + " ../invest.db", "there is no backup of ../invest.db of " + Day},
        {"restore " + Day + " misc.db", "there is no backup of misc.db of " + Day},
        {"restore 2026-11-21", "invest.db.2026-11-21 cannot be used: it is damaged"},
        {"restore 2026-11-22", "invest.db.2026-11-22 cannot be used: it has other columns than Quorvan's"},
        {"restore 2026-11-23", "what was cut is not pasted yet"},
    };
    ASSERT_TRUE(Works("cd '" + home_.Path() + "/backups'; head -c 900 invest.db." + Day +
                      " >invest.db.2026-11-21; "
                      "cp portfol.db." +
                      Day + " invest.db.2026-11-22; cp invest.db." + Day + " invest.db.2026-11-23"));
    for (const auto& [arguments, reason] : cases) {
        if (arguments.ends_with("23"))
            home_.Write("cut.db", "");
        EXPECT_TRUE(folder_.Fails(Command(arguments), 1, reason));
    }
    EXPECT_TRUE(State(home_) == present_);
    EXPECT_TRUE(OtherDays().size() == 3) << "and nothing more is kept";
}

// Whatever fails, and wherever it is killed, every file is of one state, and doing it again finishes it.
TEST_F(Backups, SurviveEveryFaultOfARestore) {
    const auto reset = [&] {
        std::filesystem::remove_all(home_.File("backups"));
        std::filesystem::create_directory(home_.File("backups"));
        for (const std::size_t i : {0U, 1U}) {
            home_.Write(Names[i], present_[i]);
            home_.Write("backups/" + Names[i] + "." + Day, earlier_[i]);
            std::filesystem::remove(home_.File(Names[i] + ".part"));
        }
    };
    QuickFiles quick;
    for (const Fault fault : {Fault::HalfThenError, Fault::KilledBefore}) {
        bool met = true;
        for (int at = 0; met; ++at) {
            reset();
            const int result = ResultInChild([&] {
                FaultyFiles files;
                files.Arm(fault, at);
                const int restored = Restore(files);
                return files.Disarm() ? 2 + restored : restored;
            });
            met = result < 0 || result > 1;
            for (const std::size_t i : {0U, 1U}) {
                const std::string content = home_.Read(Names[i]);
                EXPECT_TRUE(content == earlier_[i] || content == present_[i]) << at;
                EXPECT_TRUE(result < 0 || !home_.Has(Names[i] + ".part")) << at;
            }
            EXPECT_EQ(Restore(quick), 0);
            EXPECT_TRUE(State(home_) == earlier_);
            for (const std::size_t i : {0U, 1U})
                EXPECT_TRUE(std::ranges::any_of(OtherDays(), [&](const std::string& day) {
                    return home_.Read("backups/" + Names[i] + "." + day) == present_[i];
                })) << at;
        }
    }
}

} // namespace
