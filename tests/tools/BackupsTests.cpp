#include "CommandTest.h"
#include "DataFolder.h"
#include "InChild.h"
#include "db/FaultyFiles.h"
#include "tools/Backups.h"

namespace {

namespace fs = std::filesystem;

// A folder with portfolios A and B, and its backups of a day on which there was no B.
class Backups : public CommandTest {
  protected:
    Backups() {
        fs::create_directory(home_.File("backups"));
        home_.AddPortfolio("A");
        for (const char* name : {"kept", "changed", "removed"})
            home_.AddInvestment(MakeInvestment("A", name));
        for (const std::string name : {"portfol.db", "invest.db"})
            fs::copy(home_.File(name), home_.File("backups/" + name + ".2026-11-20"));
        earlier_ = State();
        home_.AddPortfolio("B");
        home_.AddInvestment(MakeInvestment("B", "added"));
        DATABASE investments(home_.File("invest.db").c_str());
        const INVESTMENT_DATA changed = MakeInvestment("A", "changed", 3);
        EXPECT_EQ(investments.Write(1, &changed) + investments.Delete(2), 0);
        present_ = State();
    }
    // The bytes of both files.
    std::array<std::string, 2> State() const { return {home_.Read("portfol.db"), home_.Read("invest.db")}; }
    // In the folder, as each command here.
    static std::string Command(const std::string& arguments) {
        return "quorvan-cli backups --home . " + arguments;
    }
    int Restore(FileOperations& files) const {
        std::string kept;
        std::vector<BackupFile> backups = FindBackups(home_.Path());
        std::erase_if(backups, [](const BackupFile& backup) { return backup.day != "2026-11-20"; });
        return RestoreBackups(ToolFolder(home_.Path()), backups, &kept, files).empty() ? 0 : 1;
    }

    DataFolder home_;
    const std::string in_ = "cd '" + home_.Path() + "'; ";
    std::array<std::string, 2> earlier_;
    std::array<std::string, 2> present_;
};

TEST_F(Backups, AreListedAndGoThereAndBack) {
    EXPECT_EQ(Printed(in_ + Command("")),
              "day         file        bytes  records  added  changed  removed\n"
              "2026-11-20  invest.db    1317        3      1        1        1\n"
              "2026-11-20  portfol.db    129        1      1        0        0\n");
    EXPECT_TRUE(
        Works(in_ + Command("--json"), R"({"day":"2026-11-20","file":"invest.db","bytes":1317,"rec)"));
    EXPECT_TRUE(Works(in_ + "chmod 640 invest.db; " + Command("restore 2026-11-20"),
                      "restored invest.db, portfol.db of "));
    EXPECT_TRUE(State() == earlier_);
    // Once more on the same day, and then back to what was there at first.
    EXPECT_TRUE(Works(in_ + Command("restore 2026-11-20 invest.db"), "restored invest.db of "));
    EXPECT_TRUE(Works(in_ + Command("restore $(" + Command("--json") +
                                    " | cut -c 9-25 | grep -v , | sort -u | head -n 1)")));
    EXPECT_TRUE(State() == present_);
    EXPECT_EQ(Printed(in_ + "stat -c '%a %n' *.db"), "640 invest.db\n600 misc.db\n600 portfol.db\n");
    // Old days go when a new one comes, and what a restore kept does not.
    EXPECT_EQ(Printed(in_ + "touch $(seq -f backups/invest.db.2001-01-0%g 7) $(seq -f "
                            "backups/invest.db.2001-01-0%g-010203 7); quorvan-cli db invest.db delete 0; "
                            "ls backups | grep -c 010203; ls backups | grep -c 2001-01-..$"),
              "1 record deleted\n7\n5\n");
}

TEST_F(Backups, ThatCannotBeUsedChangeNothing) {
    ASSERT_TRUE(Works(in_ + "cd backups; head -c 900 invest.db.2026-11-20 >invest.db.2026-11-21; "
                            "cp portfol.db.2026-11-20 invest.db.2026-11-22"));
    const std::pair<const char*, const char*> cases[] = {
        {"../2026-11-20", "there is no backup of ../2026-11-20 in "},
        {"2026-11-20 ../invest.db", "there is no backup of ../invest.db of 2026-11-20"},
        {"2026-11-21", "invest.db.2026-11-21 cannot be used: it is damaged"},
        {"2026-11-22", "invest.db.2026-11-22 cannot be used: it has other columns than Quorvan's"},
    };
    for (const auto& [day, reason] : cases)
        EXPECT_TRUE(folder_.Fails(in_ + Command("restore ") + day, 1, reason));
    EXPECT_TRUE(
        folder_.Fails(in_ + "touch cut.db; " + Command("restore 2026-11-20"), 1, "what was cut is not"));
    EXPECT_TRUE(State() == present_);
}

// Whatever fails, and wherever it is killed, each file is of one state, and doing it again finishes it.
TEST_F(Backups, SurviveEveryFaultOfARestore) {
    struct : FileOperations {
        int Sync(int /*file*/) override { return 0; }
    } quick;
    const TemporaryFolder before;
    fs::copy(home_.Path(), before.Path(), fs::copy_options::recursive);
    for (const Fault fault : {Fault::HalfThenError, Fault::KilledBefore}) {
        for (int at = 0, result = -1; result < 0 || result > 1; ++at) {
            home_.Clear();
            fs::copy(before.Path(), home_.Path(), fs::copy_options::recursive);
            result = ResultInChild([&] {
                FaultyFiles files;
                files.Arm(fault, at);
                const int restored = Restore(files);
                return files.Disarm() ? 2 + restored : restored;
            });
            for (const std::size_t i : {0U, 1U})
                EXPECT_TRUE(State()[i] == earlier_[i] || State()[i] == present_[i]) << at;
            EXPECT_TRUE(result < 0 || !home_.Has("invest.db.part")) << at;
            EXPECT_EQ(Restore(quick), 0);
            EXPECT_TRUE(State() == earlier_) << at;
            std::string kept;
            for (const auto& entry : fs::directory_iterator(home_.File("backups")))
                kept += home_.Read("backups/" + entry.path().filename().string());
            EXPECT_TRUE(kept.find(present_[0]) != kept.npos && kept.find(present_[1]) != kept.npos) << at;
        }
    }
}

} // namespace
