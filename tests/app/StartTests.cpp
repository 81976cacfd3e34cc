// Start-up, the password gate and shutdown, on a folder with real files.
#include "Program.h"

#include <algorithm>
#include <filesystem>

#include "util/FolderLock.h"

namespace {

constexpr const char* DataFiles[] = {"portfol.db", "invest.db", "misc.db"};

// The program in a folder whose invest.db has a deleted record, which is gone once it has ended in good
// order.
class FilledProgram : public Program {
  public:
    FilledProgram() {
        AddPortfolio("A");
        AddInvestment(MakeInvestment("A", "first"));
        AddInvestment(MakeInvestment("A", "second"));
        DATABASE(File("invest.db").c_str()).Delete(0);
    }
    void ExpectCompacted() const {
        EXPECT_EQ(RecordSlots("invest.db"), 1);
        EXPECT_EQ(Investments(), Texts{"A/second"});
        EXPECT_EQ(Portfolios(), Texts{"A"});
    }
    // A step that closes an alert with a button and keeps what it says.
    void AnswerAlert(const char* button) {
        When(
            "alert", Alert,
            [this, button] {
                said_ = Alert()->text().toStdString();
                Press(Alert(), button);
            });
    }
    [[nodiscard]] const std::string& Said() const { return said_; }

  private:
    std::string said_;
};

class StartTest : public testing::Test, protected FilledProgram {
  protected:
    using FilledProgram::Run;

    // Has the program in a folder below whose path has so many bytes, with a copy of the data files.
    std::string MoveTo(std::size_t length) {
        std::string folder = Path() + "/" + std::string(length - Path().size() - 1, 'x');
        std::filesystem::create_directory(folder);
        for (const char* file : DataFiles)
            std::filesystem::copy(File(file), folder + "/" + file);
        BApplication::SetExecutablePath((folder + "/quorvan").c_str());
        return folder;
    }
};

TEST_F(StartTest, TheCloseBoxSavesWidthsAndCompacts) {
    const std::string invest = Read("invest.db");
    Write("Quorvan.ini",
          "[DISPLAY]\nColumnWidth0=7\nColumnWidth2=120\nColumnWidth4=none\nColumnWidth5=99999999\n"
          "TextSize=99999\n");
    Expect({"second"}).Then("widths", [] {
        const float expected[] = {20, 50, 120, 50, 20, CLVColumn::kGreatestWidth, 50, 50, 50, 50, 50};
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
    ExpectCompacted();
    // What the compaction drops is kept in the backup.
    Texts kept;
    for (const auto& entry : std::filesystem::directory_iterator(File("backups"))) {
        const std::string name = entry.path().filename();
        kept.push_back(name.substr(0, name.find(".2")));
        EXPECT_TRUE(kept.back() == "portfol.db" || Read("backups/" + name) == invest) << name;
    }
    std::sort(kept.begin(), kept.end());
    EXPECT_EQ(kept, (Texts{"invest.db", "portfol.db"}));
    EXPECT_EQ(
        Read("Quorvan.ini"),
        "[DISPLAY]\nColumnWidth0=20\nColumnWidth2=120\nColumnWidth4=20\nColumnWidth5=60\nTextSize=12\n"
        "ColumnWidth1=50\n"
        "ColumnWidth3=123\nColumnWidth6=50\nColumnWidth7=50\nColumnWidth8=50\nColumnWidth9=50\nColumnWidth10="
        "50\n");
}

TEST_F(StartTest, WithoutSettingsEveryColumnIsFiftyWide) {
    std::filesystem::remove(File("Quorvan.ini"));
    Then("widths", [] {
        for (int32 i = 0; i < InvestmentColumnCount; ++i)
            EXPECT_EQ(List()->ColumnAt(i)->Width(), 50) << i;
        EXPECT_EQ(Window()->Frame(), BRect(100, 100, 600, 300));
    });
    RunAndClose();
    EXPECT_FALSE(Has("Quorvan.ini"));
}

TEST(Start, ThePasswordOpensTheWindow) {
    const struct {
        const char* what;
        const char* stored;
        const char* typed;
        Qt::Key key;
        bool opens;
        const char* alert; // instead; null when it ends without a word
    } cases[] = {
        {"a blank at the end is not kept", "Secret", "Secret ", Qt::Key_Return, true, nullptr},
        {"another letter case", "Secret", "secret", Qt::Key_Return, false, "Invalid password"},
        {"cancelled", "Secret", "Secret", Qt::Key_Escape, false, nullptr},
        {"a line that ends in CR LF", "Secret \r", "Secret", Qt::Key_Return, true, nullptr},
        // So that a longer one in the file does not lock anybody out.
        {"15 bytes count", "0123456789abcdeXYZ", "0123456789abcdeXYZ", Qt::Key_Return, true, nullptr},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(each.what);
        FilledProgram program;
        const std::string settings = std::string("[GENERAL]\nPassword=") + each.stored + "\n";
        program.Write("Quorvan.ini", settings);
        program.When("password dialog", Driver::Field, [&each] {
            EXPECT_EQ(be_app->CountWindows(), 1);
            Driver::Type(each.typed);
            Driver::Key(each.key);
        });
        if (each.alert)
            program.Answer(each.alert, "Ok");
        if (each.opens)
            program.Expect({"second"}).Close();
        program.Run();
        program.ExpectCompacted();
        EXPECT_TRUE(program.Read("Quorvan.ini").starts_with(settings));
        EXPECT_EQ(program.Read("Quorvan.ini") != settings, each.opens);
    }
}

TEST_F(StartTest, ABackupFromAnInterruptedCompactionIsPutBack) {
    std::filesystem::rename(File("invest.db"), File("invest.bak"));
    Write("invest.new", "half a file");
    Expect({"second"});
    RunAndClose();
    ExpectCompacted();
    EXPECT_FALSE(Has("invest.bak") || Has("invest.new"));
}

TEST_F(StartTest, TheLongestFolderThatFitsIsUsed) {
    const std::string folder = MoveTo(108);
    Expect({"second"}).Then("help path", [folder] {
        EXPECT_EQ(app_state->helpPath, folder + "//help/Quorvan.html");
    });
    RunAndClose();
}

// The folder is as it was when the program cannot work in it.
TEST_F(StartTest, IsRefusedAFolderThatIsTooLongOrInUse) {
    const std::string lock = "program: quorvan\nprocess: 17\nhost: elsewhere\nsince: 2026-11-22 14:03:07\n";
    FolderLock holder;
    std::string below; // the folder's path below that of the test
    const struct {
        std::function<void()> prepare;
        const char* button;
        std::string said;
    } cases[] = {
        {[&] { Write("Quorvan.lock", lock); }, "No",
         "in use by quorvan (process 17 on the computer elsewhere, since 2026-11-22 14:03:07)"},
        {[&] { EXPECT_EQ(holder.Take(Path(), "quorvan-cli"), FolderLock::Outcome::Taken); }, "Ok",
         "Quorvan cannot start: its folder " + Path() + " is in use by quorvan-cli (process " +
             std::to_string(getpid()) + " on "},
        {[&] { below = MoveTo(109).substr(Path().size()) + "/"; }, "Ok", "too long"},
    };
    const std::string invest = Read("invest.db");
    for (const auto& each : cases) {
        std::filesystem::remove(File("Quorvan.lock"));
        each.prepare();
        const std::string text = Read("Quorvan.lock");
        When("alert", Alert, [] { EXPECT_EQ(app_state->portfolios, nullptr); });
        AnswerAlert(each.button);
        EXPECT_EQ(Run(), 1);
        EXPECT_NE(Said().find(each.said), std::string::npos) << Said();
        EXPECT_EQ(Read(below + "Quorvan.lock"), below.empty() ? text : "");
        EXPECT_EQ(Read(below + "invest.db"), invest);
    }
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

TEST_F(StartTest, TakesAFolderFromAHolderOnAnotherComputerWhenToldTo) {
    Write("Quorvan.lock", "program: quorvan\nprocess: 17\nhost: elsewhere\nsince: 2026-11-22 14:03:07\n");
    AnswerAlert("Yes");
    Expect({"second"}).Then("lock", [this] {
        EXPECT_NE(Read("Quorvan.lock").find(std::to_string(getpid())), std::string::npos);
    });
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_FALSE(Has("Quorvan.lock"));
}

TEST_F(StartTest, AFolderThatCannotBeWrittenIsForLooking) {
    std::filesystem::create_directory(File("Quorvan.lock")); // also where the tests run as root
    const std::string invest = Read("invest.db");
    AnswerAlert("Ok");
    Expect({"second"}).Then("change", [] { EXPECT_EQ(app_state->investments->Delete(1), -1); });
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Said(), "The folder " + Path() +
                          " cannot be written: Quorvan.lock in it is no file of Quorvan's. You can look at "
                          "your portfolios, but no change will be kept.");
    EXPECT_EQ(Read("invest.db"), invest);
    EXPECT_FALSE(Has("backups"));
}

TEST_F(StartTest, ABackupThatFailsIsToldAndTheChangeIsMade) {
    Write("backups", "in the way");
    Expect({"second"}).Then("change", [] {
        EXPECT_EQ(app_state->investments->Delete(1), 0);
        EXPECT_EQ(app_state->investments->UnDelete(1), 0);
    });
    AnswerAlert("Ok");
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_EQ(Said(),
              "The day's backup of your portfolios could not be made in the folder \"backups\": Not a "
              "directory.\nYour changes are saved all the same.");
    ExpectCompacted();
}

// Each of these is neither understood nor changed; it is named, and the window opens without portfolios or
// without investments.
TEST(Start, FilesThatAreNoneOfTheProgramsStayAsTheyAre) {
    const struct {
        const char* what;
        std::function<void(Program&)> spoil;
        std::vector<const char*> said;
    } cases[] = {
        {"missing",
         [](Program& p) {
             for (const char* file : DataFiles)
                 std::filesystem::remove(p.File(file));
         },
         {"portfol.db is missing", "\ninvest.db is missing", "\nmisc.db is missing"}},
        {"empty",
         [](Program& p) {
             for (const char* file : DataFiles)
                 p.Write(file, "");
         },
         {"portfol.db is no data file", "\ninvest.db is no data file", "\nmisc.db is no data file"}},
        {"truncated header",
         [](Program& p) {
             p.Write("portfol.db", p.Read("portfol.db").substr(0, 51));
             p.Write("invest.db", p.Read("invest.db").substr(0, 300));
         },
         {"portfol.db is no data file", "\ninvest.db is no data file"}},
        {"text",
         [](Program& p) { p.Write("portfol.db", std::string(5000, 'x')); },
         {"portfol.db is no data file"}},
        {"exchanged",
         [](Program& p) {
             const std::string portfolios = p.Read("portfol.db");
             p.Write("portfol.db", p.Read("invest.db"));
             p.Write("invest.db", portfolios);
         },
         {"portfol.db holds other records", "\ninvest.db holds other records"}},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(each.what);
        FilledProgram program;
        DATABASE(program.File("invest.db").c_str()).Compress(0); // or the end would
        each.spoil(program);
        const auto state = [&] {
            Texts contents;
            for (const char* file : DataFiles)
                contents.push_back(program.Has(file) ? program.Read(file) : "none");
            return contents;
        };
        const Texts before = state();
        program.AnswerAlert("Ok");
        program.Expect({}, "$0.00").Then(each.what, [] { EXPECT_EQ(Program::Selector()->CountItems(), 0); });
        program.RunAndClose();
        const std::string& said = program.Said();
        for (const char* words : each.said)
            EXPECT_NE(said.find(words), std::string::npos) << words;
        EXPECT_EQ(std::count(said.begin(), said.end(), '\n') + 1, std::ssize(each.said));
        EXPECT_EQ(state(), before);
    }
}

} // namespace
