// Start-up, the password gate and shutdown, on a folder with real files.
#include "Program.h"

#include "Shell.h"
#include "util/FolderLock.h"

namespace {

// Its invest.db has a deleted record, which is gone once the program has ended in good order.
class StartTest : public testing::Test, protected Program {
  protected:
    StartTest() {
        AddPortfolio("A");
        AddInvestment(MakeInvestment("A", "first"));
        AddInvestment(MakeInvestment("A", "second"));
        DATABASE(File("invest.db").c_str()).Delete(0);
    }
    using Program::Run;

    // Has the program in a folder below whose path has so many bytes, with a copy of the files.
    std::string MoveTo(std::size_t length) {
        std::string folder = Path() + "/" + std::string(length - Path().size() - 1, 'x');
        std::filesystem::copy(Path(), folder);
        BApplication::SetExecutablePath((folder + "/quorvan").c_str());
        return folder;
    }
    // A step that answers the alert with these words in it, before a file is opened.
    void AnswerAlert(const std::string& words, const char* button) {
        const auto shown = [words] { return Alert() && Alert()->text().contains(words.c_str()); };
        When(shown, [button] {
            EXPECT_EQ(app_state->portfolios, nullptr);
            Press(Alert(), button);
        });
    }
};

// The data files are links: what belongs to them belongs where they really lie.
TEST_F(StartTest, TheCloseBoxSavesWidthsAndCompacts) {
    const std::string invest = Read("invest.db");
    std::filesystem::create_directory(File("else"));
    for (const char* name : {"portfol.db", "invest.db"}) {
        std::filesystem::rename(File(name), File("else/") + name);
        std::filesystem::create_symlink(File("else/") + name, File(name));
    }
    Write("Quorvan.ini",
          "[DISPLAY]\nColumnWidth0=7\nColumnWidth2=120\nColumnWidth4=none\nColumnWidth5=99999999\n"
          "TextSize=99999\n");
    Expect({"second"}).Then([this] {
        EXPECT_TRUE(Has("else/Quorvan.lock"));
        const float expected[] = {20, 50, 120, 50, 20, CLVColumn::GreatestWidth, 50, 50, 50, 50, 50};
        for (int32 i = 0; i < InvestmentColumnCount; ++i)
            EXPECT_EQ(List()->ColumnAt(i)->Width(), expected[i]) << i;
        Locked([] {
            List()->ColumnAt(3)->SetWidth(123.75F);
            List()->ColumnAt(5)->SetWidth(60);
        });
    });
    RunAndClose();
    EXPECT_EQ(Read("invest.db").find("first"), std::string::npos);
    EXPECT_EQ(Investments(), Texts{"A/second"});
    // What the compaction drops is kept in the backup.
    EXPECT_TRUE(Output("cat " + File("else/backups/*")) == invest + Read("portfol.db"));
    EXPECT_FALSE(Has("backups"));
    EXPECT_EQ(Read("Quorvan.ini"),
              "[DISPLAY]\nColumnWidth0=20\nColumnWidth2=120\nColumnWidth4=20\nColumnWidth5=60\nTextSize=12\n"
              "ColumnWidth1=50\nColumnWidth3=123\nColumnWidth6=50\nColumnWidth7=50\nColumnWidth8=50\n"
              "ColumnWidth9=50\nColumnWidth10=50\n"
              "WindowPlace=100 100 500 200\nColumnOrder=0 1 2 3 4 5 6 7 8 9 10\nSortKeys=\n");
}

TEST_F(StartTest, ThePasswordOpensTheWindow) {
    const std::tuple<const char*, const char*, Qt::Key, bool> cases[] = {
        {"Secret", "Secret ", Qt::Key_Return, true}, // a blank at the end is not kept
        {"Secret", "secret", Qt::Key_Return, false},
        {"Secret", "Secret", Qt::Key_Escape, false},
        {"Secret \r", "Secret", Qt::Key_Return, true},
        // 15 bytes count, so that a longer one in the file does not lock anybody out.
        {"0123456789abcdeXYZ", "0123456789abcdeXYZ", Qt::Key_Return, true}};
    for (const auto& [stored, typed, key, opens] : cases) {
        const std::string settings = std::string("[GENERAL]\nPassword=") + stored + "\n";
        Write("Quorvan.ini", settings);
        InField([typed = typed, key = key] {
            EXPECT_EQ(be_app->CountWindows(), 1);
            Type(typed, key);
        });
        if (opens)
            Expect({"second"}).Close();
        else if (key == Qt::Key_Return)
            Answer("Invalid password");
        Run();
        EXPECT_EQ(Read("Quorvan.ini") != settings, opens) << stored << typed;
    }
}

TEST_F(StartTest, IsRefusedAFolderThatIsTooLongOrInUse) {
    const auto refused = [&](const std::string& words, const char* button) {
        const std::string before = Read("Quorvan.lock") + Read("invest.db");
        AnswerAlert(words, button);
        EXPECT_EQ(Run(), 1);
        EXPECT_EQ(Read("Quorvan.lock") + Read("invest.db"), before);
    };
    Write("Quorvan.lock", "program: quorvan\nprocess: 17\nhost: elsewhere\nsince: 2026-11-22 14:03:07\n");
    refused("in use by quorvan (process 17 on the computer elsewhere, since 2026-11-22 14:03:07)", "No");
    AnswerAlert("elsewhere", "Yes");
    Expect({"second"});
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_FALSE(Has("Quorvan.lock"));

    FolderLock holder;
    EXPECT_EQ(holder.Take(Path(), "quorvan-cli"), FolderLock::Outcome::Taken);
    refused("Quorvan cannot start: its folder " + Path() + " is in use by quorvan-cli (process " +
                std::to_string(getpid()) + " on ",
            "Ok");
    for (const std::size_t length : {109, 128}) { // for what belongs in it, and by itself
        MoveTo(length);
        refused("too long", "Ok");
    }
    const std::string path = MoveTo(108) + "//help/Quorvan.html";
    Expect({"second"}).Then([path] { EXPECT_EQ(app_state->helpPath, path); });
    EXPECT_EQ(RunAndClose(), 0);
}

TEST_F(StartTest, AFolderThatCannotBeWrittenIsForLooking) {
    std::filesystem::create_directory(File("Quorvan.lock")); // also where the tests run as root
    const std::string invest = Read("invest.db");
    Answer("The folder " + Path() +
           " cannot be written: Quorvan.lock in it is no file of Quorvan's. You can "
           "look at your portfolios, but no change will be kept.");
    Expect({"second"}).Then([] { EXPECT_EQ(app_state->investments->Delete(1), -1); });
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Read("invest.db"), invest);
    EXPECT_FALSE(Has("backups"));
}

TEST_F(StartTest, ABackupThatFailsIsToldAndTheChangeIsMade) {
    Write("backups", "in the way");
    Mark({0}).Send(MessageInvestmentDelete);
    Answer("The day's backup of your portfolios could not be made in the folder \"backups\": Not a "
           "directory.\nYour changes are saved all the same.");
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Investments(), Texts{});
}

TEST_F(StartTest, FilesThatAreNoneOfTheProgramsStayAsTheyAre) {
    const std::string portfolios = Read("portfol.db"), investments = Read("invest.db");
    Write("portfol.db", investments);
    Write("invest.db", portfolios);
    for (const char* missing : {"misc.db", "Quorvan.ini"})
        std::filesystem::remove(File(missing));
    Answer("portfol.db holds other records than Quorvan's. It is left as it is.\n"
           "invest.db holds other records than Quorvan's. It is left as it is.\n"
           "misc.db is missing. \"quorvan-cli setup " +
           Path() + "\" makes a new one.");
    Expect({}, "$0.00").Then([] {
        EXPECT_EQ(Selector()->CountItems(), 0);
        EXPECT_EQ(List()->ColumnAt(0)->Width() + List()->ColumnAt(10)->Width(), 100);
        EXPECT_EQ(Window()->Frame(), BRect(100, 100, 600, 300));
    });
    RunAndClose();
    EXPECT_TRUE(Read("portfol.db") == investments && Read("invest.db") == portfolios);
    EXPECT_FALSE(Has("misc.db") || Has("Quorvan.ini"));
}

TEST_F(StartTest, PortfoliosThatWereNotInTheListAreNamed) {
    for (const char* name : {"1", "2", "3", "4", "5", "6", "7"})
        AddInvestment(MakeInvestment(name, std::string("of ") + name));
    Answer("There are investments of portfolios that were not in the list. These portfolios are in "
           "the list again: \"1\", \"2\", \"3\", \"4\", \"5\" and 2 more.");
    Expect({"of 7"}).Select("A").Expect({"second"});
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Portfolios(), (Texts{"A", "1", "2", "3", "4", "5", "6", "7"}));
}

} // namespace
