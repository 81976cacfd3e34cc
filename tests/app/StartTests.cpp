// Start-up, the password gate and shutdown, on a folder with real files.
#include "Program.h"

#include <filesystem>
#include <set>

#include "util/FolderLock.h"

namespace {

constexpr const char* LockOfAnotherComputer =
    "program: quorvan\nprocess: 17\nhost: elsewhere\nsince: 2026-11-22 14:03:07\n";

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

    // Has the program in a folder below whose path has so many bytes, with a copy of the data files.
    std::string MoveTo(std::size_t length) {
        std::string folder = Path() + "/" + std::string(length - Path().size() - 1, 'x');
        std::filesystem::create_directory(folder);
        for (const char* file : {"portfol.db", "invest.db", "misc.db"})
            std::filesystem::copy(File(file), folder + "/" + file);
        BApplication::SetExecutablePath((folder + "/quorvan").c_str());
        return folder;
    }
    // A step that answers the alert with these words in it.
    Program& AnswerAlert(const std::string& words, const char* button) {
        When(
            "alert: " + words,
            [words] { return Alert() && Alert()->text().contains(QString::fromStdString(words)); },
            [button] { Press(Alert(), button); });
        return *this;
    }
};

TEST_F(StartTest, TheCloseBoxSavesWidthsAndCompacts) {
    const std::string invest = Read("invest.db");
    Write("Quorvan.ini",
          "[DISPLAY]\nColumnWidth0=7\nColumnWidth2=120\nColumnWidth4=none\nColumnWidth5=99999999\n"
          "TextSize=99999\n");
    Expect({"second"}).Then("widths", [] {
        const float expected[] = {20, 50, 120, 50, 20, CLVColumn::GreatestWidth, 50, 50, 50, 50, 50};
        for (int32 i = 0; i < InvestmentColumnCount; ++i)
            EXPECT_EQ(List()->ColumnAt(i)->Width(), expected[i]) << i;
        Locked([] {
            const int32 order[] = {0, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1};
            EXPECT_TRUE(List()->SetDisplayOrder(order));
            List()->ColumnAt(3)->SetWidth(123.75F);
            List()->ColumnAt(5)->SetWidth(60);
        });
    });
    RunAndClose();
    EXPECT_EQ(RecordSlots("invest.db"), 1);
    EXPECT_EQ(Investments(), Texts{"A/second"});
    // What the compaction drops is kept in the backup.
    std::multiset<std::string> kept;
    for (const auto& entry : std::filesystem::directory_iterator(File("backups")))
        kept.insert(Read("backups/" + entry.path().filename().string()));
    EXPECT_TRUE(kept == (std::multiset{invest, Read("portfol.db")}));
    EXPECT_EQ(Read("Quorvan.ini"),
              "[DISPLAY]\nColumnWidth0=20\nColumnWidth2=120\nColumnWidth4=20\nColumnWidth5=60\nTextSize=12\n"
              "ColumnWidth1=50\nColumnWidth3=123\nColumnWidth6=50\nColumnWidth7=50\nColumnWidth8=50\n"
              "ColumnWidth9=50\nColumnWidth10=50\n");
}

TEST_F(StartTest, WithoutSettingsEveryColumnIsFiftyWide) {
    std::filesystem::remove(File("Quorvan.ini"));
    Then("widths", [] {
        EXPECT_EQ(List()->ColumnAt(0)->Width() + List()->ColumnAt(10)->Width(), 100);
        EXPECT_EQ(Window()->Frame(), BRect(100, 100, 600, 300));
    });
    RunAndClose();
    EXPECT_FALSE(Has("Quorvan.ini"));
}

TEST_F(StartTest, ThePasswordOpensTheWindow) {
    for (const auto& [stored, typed, key, opens] :
         {std::tuple{"Secret", "Secret ", Qt::Key_Return, true}, // a blank at the end is not kept
          {"Secret", "secret", Qt::Key_Return, false},
          {"Secret", "Secret", Qt::Key_Escape, false},
          {"Secret \r", "Secret", Qt::Key_Return, true},
          // 15 bytes count, so that a longer one in the file does not lock anybody out.
          {"0123456789abcdeXYZ", "0123456789abcdeXYZ", Qt::Key_Return, true}}) {
        const std::string settings = std::string("[GENERAL]\nPassword=") + stored + "\n";
        Write("Quorvan.ini", settings);
        When("password dialog", Field, [typed = typed, key = key] {
            EXPECT_EQ(be_app->CountWindows(), 1);
            Type(typed, key);
        });
        if (opens)
            Expect({"second"}).Close();
        else if (key == Qt::Key_Return)
            Answer("Invalid password", "Ok");
        Run();
        EXPECT_EQ(Read("Quorvan.ini") != settings, opens) << stored << typed;
    }
}

// The folder is as it was when the program cannot work in it.
TEST_F(StartTest, IsRefusedAFolderThatIsTooLongOrInUse) {
    const std::string invest = Read("invest.db");
    const auto refused = [&](const std::string& words, const char* button) {
        const std::string lock = Read("Quorvan.lock");
        When("alert", Alert, [] { EXPECT_EQ(app_state->portfolios, nullptr); });
        AnswerAlert(words, button);
        EXPECT_EQ(Run(), 1);
        EXPECT_EQ(Read("Quorvan.lock"), lock);
        EXPECT_EQ(Read("invest.db"), invest);
        std::filesystem::remove(File("Quorvan.lock"));
    };
    Write("Quorvan.lock", LockOfAnotherComputer);
    refused("in use by quorvan (process 17 on the computer elsewhere, since 2026-11-22 14:03:07)", "No");
    {
        FolderLock holder;
        EXPECT_EQ(holder.Take(Path(), "quorvan-cli"), FolderLock::Outcome::Taken);
        refused("Quorvan cannot start: its folder " + Path() + " is in use by quorvan-cli (process " +
                    std::to_string(getpid()) + " on ",
                "Ok");
    }
    MoveTo(109);
    refused("too long", "Ok");
    const std::string folder = MoveTo(108);
    Expect({"second"}).Then("help path", [folder] {
        EXPECT_EQ(app_state->helpPath, folder + "//help/Quorvan.html");
    });
    EXPECT_EQ(RunAndClose(), 0);
}

TEST_F(StartTest, TakesAFolderFromAHolderOnAnotherComputerWhenToldTo) {
    Write("Quorvan.lock", LockOfAnotherComputer);
    AnswerAlert("elsewhere", "Yes").Expect({"second"});
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_FALSE(Has("Quorvan.lock"));
}

TEST_F(StartTest, DataFilesBehindLinksAreLockedAndKeptWhereTheyLie) {
    std::filesystem::create_directory(File("else"));
    for (const char* name : {"portfol.db", "invest.db"}) {
        std::filesystem::rename(File(name), File("else/") + name);
        std::filesystem::create_symlink(File("else/") + name, File(name));
    }
    Expect({"second"}).Then("locked", [this] { EXPECT_TRUE(Has("else/Quorvan.lock")); });
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_TRUE(Has("else/backups") && !Has("backups"));
}

TEST_F(StartTest, AFolderThatCannotBeWrittenIsForLooking) {
    std::filesystem::create_directory(File("Quorvan.lock")); // also where the tests run as root
    const std::string invest = Read("invest.db");
    const std::string said = "The folder " + Path() +
                             " cannot be written: Quorvan.lock in it is no file of Quorvan's. You can look "
                             "at your portfolios, but no change will be kept.";
    Answer(said.c_str(), "Ok");
    Expect({"second"}).Then("change", [] { EXPECT_EQ(app_state->investments->Delete(1), -1); });
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Read("invest.db"), invest);
    EXPECT_FALSE(Has("backups"));
}

TEST_F(StartTest, ABackupThatFailsIsToldAndTheChangeIsMade) {
    Write("backups", "in the way");
    Mark({0}).Send(MessageInvestmentDelete);
    Answer("The day's backup of your portfolios could not be made in the folder \"backups\": Not a "
           "directory.\nYour changes are saved all the same.",
           "Ok");
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Investments(), Texts{});
}

// They are neither understood nor changed.
TEST_F(StartTest, FilesThatAreNoneOfTheProgramsStayAsTheyAre) {
    const std::string portfolios = Read("portfol.db");
    const std::string investments = Read("invest.db");
    Write("portfol.db", investments);
    Write("invest.db", portfolios);
    std::filesystem::remove(File("misc.db"));
    const std::string said = "portfol.db holds other records than Quorvan's. It is left as it is.\n"
                             "invest.db holds other records than Quorvan's. It is left as it is.\n"
                             "misc.db is missing. \"quorvan-cli setup " +
                             Path() + "\" makes a new one.";
    Answer(said.c_str(), "Ok");
    Expect({}, "$0.00").Then("no portfolios", [] { EXPECT_EQ(Selector()->CountItems(), 0); });
    RunAndClose();
    EXPECT_TRUE(Read("portfol.db") == investments && Read("invest.db") == portfolios && !Has("misc.db"));
}

TEST_F(StartTest, PortfoliosThatWereNotInTheListAreNamed) {
    for (const char* name : {"1", "2", "3", "4", "5", "6", "7"})
        AddInvestment(MakeInvestment(name, std::string("of ") + name));
    Answer("There are investments of portfolios that were not in the list. These portfolios are in "
           "the list again: \"1\", \"2\", \"3\", \"4\", \"5\" and 2 more.",
           "Ok");
    Expect({"of 7"}).Select("A").Expect({"second"});
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Portfolios(), (Texts{"A", "1", "2", "3", "4", "5", "6", "7"}));
}

} // namespace
