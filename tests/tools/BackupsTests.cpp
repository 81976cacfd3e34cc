#include "CommandTest.h"
#include "tools/Backups.h"

namespace {

namespace fs = std::filesystem;

// A folder with portfolios A and B, and its backups of a day on which there was no B.
class Backups : public HomeTest {
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
    int Restore(FileOperations& files) const {
        std::string kept;
        const std::vector<BackupFile> found = FindBackups(home_.Path()); // and what restores kept
        const std::vector<BackupFile> backups(found.begin(), found.begin() + 2);
        return RestoreBackups(ToolFolder(home_.Path()), backups, &kept, files).empty() ? 0 : 1;
    }

    const std::string in_ = "cd '" + home_.Path() + "'; backups() { quorvan-cli backups --home . $*; }; ";
    std::array<std::string, 2> earlier_;
    std::array<std::string, 2> present_;
};

TEST_F(Backups, AreListedAndGoThereAndBack) {
    home_.Write("backups/notes.txt.2026-11-20", "");
    EXPECT_EQ(Printed(in_ + "backups"), "day         file        bytes  records  added  changed  removed\n"
                                        "2026-11-20  invest.db    1317        3      1        1        1\n"
                                        "2026-11-20  portfol.db    129        1      1        0        0\n");
    EXPECT_TRUE(Works(in_ + "backups --json", R"({"day":"2026-11-20","file":"invest.db","bytes":1317,"rec)"));
    EXPECT_TRUE(folder_.Fails(in_ + "backups >/dev/full", 1, "No space left on device"));
    EXPECT_TRUE(
        Works(in_ + "chmod 640 invest.db; backups restore 2026-11-20", "restored invest.db, portfol.db of "));
    EXPECT_TRUE(State() == earlier_);
    // Once more on the same day, and then back to what was there at first.
    EXPECT_TRUE(Works(in_ + "backups restore 2026-11-20 invest.db", "restored invest.db of "));
    EXPECT_TRUE(
        Works(in_ + "backups restore $(backups --json | cut -c 9-25 | grep -v , | sort -u | head -n 1)"));
    EXPECT_TRUE(State() == present_);
    EXPECT_EQ(Printed(in_ + "stat -c '%a %n' *.db"), "640 invest.db\n600 misc.db\n600 portfol.db\n");
    // Old days go when a new one comes, and what a restore kept does not.
    EXPECT_EQ(Printed(in_ + "cd backups; touch $(seq -f invest.db.2001-01-0%g 7) invest.db.2001-01-01-010203;"
                            "quorvan-cli db ../invest.db delete 0; ls | grep 2001 | head -n 2 | cut -c 11-"),
              "1 record deleted\n2001-01-01-010203\n2001-01-03\n");
}

TEST_F(Backups, ThatCannotBeUsedChangeNothing) {
    ASSERT_TRUE(Works(in_ + "cd backups; head -c 900 invest.db.2026-11-20 >invest.db.2026-11-21; "
                            "cp portfol.db.2026-11-20 invest.db.2026-11-22"));
    const std::pair<const char*, const char*> cases[] = {
        {"../2026-11-20", "there is no backup of ../2026-11-20 in "},
        {"2026-11-20 ../invest.db", "there is no backup of ../invest.db of 2026-11-20"},
        {"2026-11-21", "invest.db.2026-11-21 cannot be used: it is damaged"},
        {"2026-11-22", "invest.db.2026-11-22 cannot be used: it has other columns than Quorvan's"},
        {"2026-11-20 $(touch cut.db)", "what was cut is not pasted yet"},
    };
    for (const auto& [day, reason] : cases)
        EXPECT_TRUE(folder_.Fails(in_ + "backups restore " + day, 1, reason));
    EXPECT_TRUE(State() == present_);
}

// Whatever fails, and wherever it is killed, each file is of one state, and doing it again finishes it.
TEST_F(Backups, SurviveEveryFaultOfARestore) {
    int mixed = 0; // only a rename that fails stops between the files, and kills on their way
    const auto restore = [this](FileOperations& files) { return Restore(files); };
    AtEveryCall({Fault::HalfThenError, Fault::KilledBefore}, restore, [&](int result) {
        for (const std::size_t i : {0U, 1U})
            EXPECT_TRUE(State()[i] == earlier_[i] || State()[i] == present_[i]);
        mixed += result >= 0 && State() != earlier_ && State() != present_ ? 1 : 0;
        EXPECT_TRUE(result < 0 || !home_.Has("invest.db.part"));
        FileOperations files;
        EXPECT_EQ(Restore(files), 0);
        EXPECT_TRUE(State() == earlier_);
        const std::string kept = Printed(in_ + "cat backups/*");
        EXPECT_TRUE(kept.find(present_[0]) != kept.npos && kept.find(present_[1]) != kept.npos);
    });
    EXPECT_EQ(mixed, 1);
}

} // namespace
