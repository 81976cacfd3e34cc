// Start-up, the password gate and shutdown, on a folder with real files.
#include "Program.h"

#include <algorithm>
#include <filesystem>

#include <QLineEdit>

#include "util/FolderLock.h"

namespace {

// A folder whose invest.db has a deleted record, which is gone once the program has ended in good order.
class StartTest : public testing::Test {
  protected:
    StartTest() {
        program_.AddPortfolio("A");
        program_.AddInvestment(MakeInvestment("A", "first"));
        program_.AddInvestment(MakeInvestment("A", "second"));
        DATABASE(program_.File("invest.db").c_str()).Delete(0);
    }
    void ExpectCompacted() const {
        EXPECT_EQ(program_.RecordSlots("invest.db"), 1);
        EXPECT_EQ(program_.Investments(), Texts{"A/second"});
        EXPECT_EQ(program_.Portfolios(), Texts{"A"});
    }
    // Types into the password dialog.
    void Answer(const char* typed, Qt::Key key) {
        program_.When(
            "password dialog",
            [] { return qobject_cast<QLineEdit*>(QApplication::focusWidget()) != nullptr; },
            [typed, key] {
                EXPECT_EQ(be_app->CountWindows(), 1);
                QTest::keyClicks(QApplication::focusWidget(), typed);
                QTest::keyClick(QApplication::focusWidget(), key);
            });
    }

    Program program_;
};

TEST_F(StartTest, TheCloseBoxSavesWidthsAndCompacts) {
    program_.Write("Quorvan.ini",
                   "[DISPLAY]\nColumnWidth0=7\nColumnWidth2=120\nColumnWidth4=none\nColumnWidth5=99999999\n");
    program_.Expect({"second"})
        .Then("widths",
              [] {
                  const float expected[] = {20, 50, 120, 50, 20, CLVColumn::kGreatestWidth,
                                            50, 50, 50,  50, 50};
                  for (int32 i = 0; i < InvestmentColumnCount; ++i)
                      EXPECT_EQ(Program::List()->ColumnAt(i)->Width(), expected[i]) << i;
                  Program::Locked([] {
                      const int32 order[] = {0, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1};
                      EXPECT_TRUE(Program::List()->SetDisplayOrder(order));
                      Program::List()->ColumnAt(3)->SetWidth(123.75F);
                      Program::List()->ColumnAt(5)->SetWidth(60);
                  });
              })
        .Close();
    program_.Run();
    ExpectCompacted();
    EXPECT_EQ(
        program_.Read("Quorvan.ini"),
        "[DISPLAY]\nColumnWidth0=20\nColumnWidth2=120\nColumnWidth4=20\nColumnWidth5=60\nColumnWidth1=50\n"
        "ColumnWidth3=123\nColumnWidth6=50\nColumnWidth7=50\nColumnWidth8=50\nColumnWidth9=50\nColumnWidth10="
        "50\n");
}

TEST_F(StartTest, WithoutSettingsEveryColumnIsFiftyWide) {
    std::filesystem::remove(program_.File("Quorvan.ini"));
    program_
        .Then("widths",
              [] {
                  for (int32 i = 0; i < InvestmentColumnCount; ++i)
                      EXPECT_EQ(Program::List()->ColumnAt(i)->Width(), 50) << i;
                  EXPECT_EQ(Program::Window()->Frame(), BRect(100, 100, 600, 300));
              })
        .Close();
    program_.Run();
    EXPECT_FALSE(program_.Has("Quorvan.ini"));
}

TEST_F(StartTest, QuitInTheMenuEndsTheProgram) {
    program_.When(
        "active window", [] { return Program::Main() && Program::Main()->isActiveWindow(); },
        [] { QTest::keyClick(Program::Main(), Qt::Key_Q, Qt::ControlModifier); });
    program_.Run();
    ExpectCompacted();
    EXPECT_NE(program_.Read("Quorvan.ini").find("ColumnWidth10=50\n"), std::string::npos);
}

TEST_F(StartTest, TheRightPasswordOpensTheWindow) {
    program_.Write("Quorvan.ini", "[GENERAL]\nPassword=Secret\n");
    Answer("Secret ", Qt::Key_Return); // a blank at the end is not kept, so it does not count
    program_.Expect({"second"}).Close();
    program_.Run();
    ExpectCompacted();
}

TEST_F(StartTest, AnotherLetterCaseIsRefused) {
    program_.Write("Quorvan.ini", "[GENERAL]\nPassword=Secret\n");
    Answer("secret", Qt::Key_Return);
    program_.Driver::Answer("Invalid password", "Ok");
    program_.Run();
    ExpectCompacted();
    EXPECT_EQ(program_.Read("Quorvan.ini"), "[GENERAL]\nPassword=Secret\n");
}

TEST_F(StartTest, ACancelledPasswordEndsWithoutAWord) {
    program_.Write("Quorvan.ini", "[GENERAL]\nPassword=Secret\n");
    Answer("Secret", Qt::Key_Escape);
    program_.Run();
    ExpectCompacted();
}

// Both are compared in 15 bytes, so that a longer one in the file does not lock anybody out.
TEST_F(StartTest, ALongPasswordCountsForFifteenBytes) {
    program_.Write("Quorvan.ini", "[GENERAL]\nPassword=0123456789abcdeXYZ\n");
    Answer("0123456789abcdeXYZ", Qt::Key_Return);
    program_.Expect({"second"}).Close();
    program_.Run();
}

TEST_F(StartTest, ABackupFromAnInterruptedCompactionIsPutBack) {
    std::filesystem::rename(program_.File("invest.db"), program_.File("invest.bak"));
    program_.Write("invest.new", "half a file");
    program_.Expect({"second"}).Close();
    program_.Run();
    ExpectCompacted();
    EXPECT_FALSE(program_.Has("invest.bak") || program_.Has("invest.new"));
}

TEST_F(StartTest, AFolderWithTooLongAPathIsLeftAlone) {
    std::string folder = program_.Path();
    const std::string part = "/" + std::string(108 - folder.size(), 'x');
    std::filesystem::create_directory(folder + part);
    for (const char* file : {"portfol.db", "invest.db", "Quorvan.ini"})
        std::filesystem::copy(program_.File(file), folder + part + "/" + file);
    BApplication::SetExecutablePath((folder + part + "/quorvan").c_str());
    program_.When("alert", Driver::Alert, [] {
        EXPECT_TRUE(Driver::Alert()->text().contains("too long"));
        EXPECT_EQ(app_state->portfolios, nullptr);
        Driver::Press(Driver::Alert(), "Ok");
    });
    program_.Run();
    EXPECT_EQ(program_.Read(part.substr(1) + "/invest.db"), program_.Read("invest.db"));
}

TEST_F(StartTest, TheLongestFolderThatFitsIsUsed) {
    const std::string folder = program_.Path() + "/" + std::string(107 - program_.Path().size(), 'x');
    std::filesystem::create_directory(folder);
    for (const char* file : {"portfol.db", "invest.db", "misc.db"})
        std::filesystem::copy(program_.File(file), folder + "/" + file);
    BApplication::SetExecutablePath((folder + "/quorvan").c_str());
    program_.Expect({"second"})
        .Then("help path", [folder] { EXPECT_EQ(app_state->helpPath, folder + "//help/Quorvan.html"); })
        .Close();
    program_.Run();
}

// What the alert says, once it is closed with a button.
void AnswerAlert(Program& program, const char* button, std::string& said) {
    program.When("alert", Driver::Alert, [&said, button] {
        said = Driver::Alert()->text().toStdString();
        Driver::Press(Driver::Alert(), button);
    });
}

TEST_F(StartTest, AFolderInUseIsLeftToItsHolder) {
    FolderLock holder;
    ASSERT_EQ(holder.Take(program_.Path(), "quorvan-cli"), FolderLock::Outcome::Taken);
    const std::string text = program_.Read("Quorvan.lock");
    const std::string invest = program_.Read("invest.db");
    std::string said;
    AnswerAlert(program_, "Ok", said);
    EXPECT_EQ(program_.Run(), 1);
    EXPECT_TRUE(said.starts_with("Quorvan cannot start: its folder " + program_.Path() +
                                 " is in use by quorvan-cli (process " + std::to_string(getpid()) + " on "))
        << said;
    EXPECT_EQ(program_.Read("Quorvan.lock"), text);
    EXPECT_EQ(program_.Read("invest.db"), invest);
}

TEST_F(StartTest, AHolderOnAnotherComputerIsAskedAbout) {
    const std::string text = "program: quorvan\nprocess: 17\nhost: elsewhere\nsince: 2026-11-22 14:03:07\n";
    program_.Write("Quorvan.lock", text);
    std::string asked;
    AnswerAlert(program_, "No", asked);
    EXPECT_EQ(program_.Run(), 1);
    EXPECT_NE(asked.find("quorvan (process 17 on the computer elsewhere, since 2026-11-22 14:03:07)"),
              std::string::npos);
    EXPECT_EQ(program_.Read("Quorvan.lock"), text);
    AnswerAlert(program_, "Yes", asked);
    program_.Expect({"second"})
        .Then("lock",
              [&] {
                  EXPECT_NE(program_.Read("Quorvan.lock").find(std::to_string(getpid())), std::string::npos);
              })
        .Close();
    EXPECT_EQ(program_.Run(), 0);
    EXPECT_FALSE(program_.Has("Quorvan.lock"));
}

TEST_F(StartTest, AFolderThatCannotBeWrittenIsForLooking) {
    std::filesystem::create_directory(program_.File("Quorvan.lock")); // also where the tests run as root
    const std::string invest = program_.Read("invest.db");
    std::string said;
    AnswerAlert(program_, "Ok", said);
    program_.Expect({"second"})
        .Then("change", [] { EXPECT_EQ(app_state->investments->Delete(1), -1); })
        .Close();
    EXPECT_EQ(program_.Run(), 0);
    EXPECT_EQ(said,
              "The folder " + program_.Path() +
                  " cannot be written: Quorvan.lock in it is no file of Quorvan's. You can look at your "
                  "portfolios, but no change will be kept.");
    EXPECT_EQ(program_.Read("invest.db"), invest);
    EXPECT_FALSE(program_.Has("backups"));
}

TEST_F(StartTest, WhatTheLastCompactionDropsIsKeptInTheBackup) {
    const std::string invest = program_.Read("invest.db");
    program_.Expect({"second"}).Close();
    program_.Run();
    ExpectCompacted();
    int kept = 0;
    for (const auto& entry : std::filesystem::directory_iterator(program_.File("backups"))) {
        const std::string name = entry.path().filename();
        EXPECT_TRUE(name.starts_with("portfol.db.") || program_.Read("backups/" + name) == invest) << name;
        ++kept;
    }
    EXPECT_EQ(kept, 2);
}

TEST_F(StartTest, ABackupThatFailsIsToldAndTheChangeIsMade) {
    program_.Write("backups", "in the way");
    program_.Expect({"second"}).Then("change", [] {
        EXPECT_EQ(app_state->investments->Delete(1), 0);
        EXPECT_EQ(app_state->investments->UnDelete(1), 0);
    });
    std::string said;
    AnswerAlert(program_, "Ok", said);
    program_.Close();
    EXPECT_EQ(program_.Run(), 0);
    EXPECT_EQ(said, "The day's backup of your portfolios could not be made in the folder \"backups\": Not a "
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
             for (const char* file : {"portfol.db", "invest.db", "misc.db"})
                 std::filesystem::remove(p.File(file));
         },
         {"portfol.db is missing", "\ninvest.db is missing", "\nmisc.db is missing"}},
        {"empty",
         [](Program& p) {
             for (const char* file : {"portfol.db", "invest.db", "misc.db"})
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
        Program program;
        program.AddPortfolio("A");
        program.AddInvestment(MakeInvestment("A", "first"));
        each.spoil(program);
        std::vector<std::pair<const char*, std::string>> before;
        for (const char* file : {"portfol.db", "invest.db", "misc.db"}) {
            if (program.Has(file))
                before.emplace_back(file, program.Read(file));
        }
        std::string said;
        AnswerAlert(program, "Ok", said);
        program
            .Then(each.what,
                  [&] {
                      EXPECT_EQ(Program::Selector()->CountItems(), 0) << each.what;
                      EXPECT_EQ(Program::List()->CountItems(), 0) << each.what;
                      EXPECT_EQ(Program::Total(), "Total Value: $0.00");
                  })
            .Close();
        program.Run();
        for (const char* words : each.said)
            EXPECT_NE(said.find(words), std::string::npos) << each.what << ": " << words;
        EXPECT_EQ(std::count(said.begin(), said.end(), '\n') + 1, std::ssize(each.said)) << each.what;
        for (const auto& [file, content] : before)
            EXPECT_EQ(program.Read(file), content) << each.what << ": " << file;
        EXPECT_EQ(program.Has("portfol.db"), !before.empty());
    }
}

} // namespace
