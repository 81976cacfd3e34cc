// The main window, worked with real events.
#include "Program.h"

#include <QLineEdit>
#include <QPushButton>

#include "platform/MenuItem.h"
#include "platform/Roster.h"

namespace {

struct MenuState {
    uint32 code;
    bool noPortfolio, noInvestment, investments;
};
constexpr MenuState MenuStates[] = {
    {1000, true, true, true},   // Settings
    {1010, true, true, true},   // Portfolio Add
    {1011, false, true, true},  // Edit
    {1012, false, true, true},  // Del
    {1013, false, false, true}, // Chart
    {1014, false, false, true}, // Print
    {1016, false, false, true}, // Update prices
    {1020, false, true, true},  // Investment Add
    {1021, false, false, true}, // Edit
    {1022, false, false, true}, // Del
    {1023, false, false, true}, // Cut
    {1024, false, false, true}, // Copy
    {1025, false, true, true},  // Paste
    {1030, true, true, true},   // Help
    {B_ABOUT_REQUESTED, true, true, true},
    {B_QUIT_REQUESTED, true, true, true},
};

// Opens and closes a menu by the mouse.
void OpenMenu(const char* title) {
    auto* bar = Program::Main()->findChild<QMenuBar*>();
    for (const QAction* action : bar->actions()) {
        if (action->menu()->objectName() == title) {
            QTest::mouseClick(bar, Qt::LeftButton, {},
                              bar->actionGeometry(const_cast<QAction*>(action)).center());
            ASSERT_TRUE(action->menu()->isVisible());
            QTest::keyClick(action->menu(), Qt::Key_Escape);
        }
    }
}

void ExpectMenus(bool MenuState::*state) {
    for (const char* menu : {"File", "Portfolio", "Investment", "Help"})
        OpenMenu(menu);
    for (const MenuState& each : MenuStates)
        EXPECT_EQ(Program::Find<BMenuBar>()->FindItem(each.code)->IsEnabled(), each.*state) << each.code;
}

TEST(NorvelWindow, MenuItemsFollowTheMarkAndTheRows) {
    Program program;
    program.AddPortfolio("Empty");
    program.AddPortfolio("Full");
    program.AddInvestment(MakeInvestment("Full", "a"));
    program.Expect({"a"})
        .Then("with investments", [] { ExpectMenus(&MenuState::investments); })
        .Select("Empty")
        .Expect({})
        .Then("without investments",
              [] {
                  ExpectMenus(&MenuState::noInvestment);
                  EXPECT_STREQ(Program::Selector()->FindMarked()->Label(), "Empty");
              })
        .Close();
    program.Run();
}

TEST(NorvelWindow, WithoutPortfoliosLittleIsEnabled) {
    Program program;
    program
        .Then("without portfolios",
              [] {
                  ExpectMenus(&MenuState::noPortfolio);
                  EXPECT_EQ(Program::Selector()->FindMarked(), nullptr);
                  EXPECT_STREQ(Program::Selector()->Name(), "        ");
                  Driver::Press(Program::Main(), "add button");
              })
        .Answer("This command requires that a portfolio be created first.", "Ok");
    program.Close();
    program.Run();
}

TEST(NorvelWindow, ShowsTheLastPortfolioAndChangesByTheSelector) {
    Program program;
    for (const char* name : {"First one", "Second"})
        program.AddPortfolio(name);
    program.AddInvestment(MakeInvestment("First one", "a", 1000, 1234.5F));
    program.AddInvestment(MakeInvestment("Second", "b", 1, 2));
    program.AddInvestment(MakeInvestment("First one", "c", 1, 0.25F));
    program.Expect({"b"})
        .Then("start",
              [] {
                  EXPECT_EQ(Program::Total(), "Total Value: $2.00");
                  EXPECT_EQ(Program::Selector()->CountItems(), 2);
                  EXPECT_STREQ(Program::Selector()->FindMarked()->Label(), "Second");
                  for (auto* field : Program::Main()->findChildren<QPushButton*>()) {
                      if (field->menu())
                          QTest::keyClick(field, Qt::Key_Space);
                  }
              })
        .When(
            "open selector", [] { return QApplication::activePopupWidget() != nullptr; },
            [] {
                QTest::keyClick(QApplication::activePopupWidget(), Qt::Key_Up);
                QTest::keyClick(QApplication::activePopupWidget(), Qt::Key_Return);
            });
    program.Expect({"a", "c"})
        .Then("chosen",
              [] {
                  EXPECT_EQ(Program::Total(), "Total Value: $1,234,500.25");
                  EXPECT_STREQ(Program::Selector()->FindMarked()->Label(), "First one");
              })
        .Close();
    program.Run();
}

TEST(NorvelWindow, TheTotalStandsClearOfTheSelector) {
    Program program;
    program.AddPortfolio("WWWWWWWWWWWWWWWWWWWWWWWWWWWWWWW");
    program.AddPortfolio("i");
    float right = 0;
    program
        .Then("short name",
              [&] {
                  EXPECT_EQ(Program::Find<BStringView>()->Frame().left, 200);
                  right = Program::Find<BMenuField>()->VisibleRight();
                  EXPECT_LT(right, 190);
                  Program::Locked([] { Program::Selector()->ItemAt(0)->SetMarked(true); });
                  EXPECT_GT(Program::Find<BMenuField>()->VisibleRight(), right);
                  EXPECT_EQ(Program::Find<BStringView>()->Frame().left,
                            Program::Find<BMenuField>()->VisibleRight() + 10);
              })
        .Close();
    program.Run();
}

TEST(NorvelWindow, AClickOnAHeaderSortsByText) {
    Program program;
    program.AddPortfolio("A");
    const std::pair<const char*, float> values[] = {{"b", 980}, {"a", 1250}, {"C", 7}, {"d", 12345}};
    for (const auto& [name, value] : values)
        program.AddInvestment(MakeInvestment("A", name, 1, value));
    const auto click = [](int32 column) {
        return [column] {
            const CLVColumn* clicked = Program::List()->ColumnAt(column);
            auto* header = Program::Main()->findChild<QWidget*>("column labels");
            QTest::mouseClick(header, Qt::LeftButton, {},
                              QPoint(static_cast<int>((clicked->Begin() + clicked->End()) / 2), 8));
        };
    };
    program.Expect({"b", "a", "C", "d"})
        .Then("Value", click(static_cast<int32>(InvestmentColumn::Value)))
        .Expect({"d", "a", "C", "b"}) // "12,345.00", "1250.00", "7.00", "980.00"
        .Then("Name", click(static_cast<int32>(InvestmentColumn::Name)))
        .Expect({"a", "b", "C", "d"})
        .Then("Name again", click(static_cast<int32>(InvestmentColumn::Name)))
        .Expect({"d", "C", "b", "a"});
    program.Select("A").Expect({"d", "C", "b", "a"}); // loaded anew, and still as the header says
    program.Close();
    program.Run();
}

TEST(NorvelWindow, DeletesTheSelectedInvestments) {
    Program program;
    program.AddPortfolio("A");
    for (const char* name : {"a", "b", "c", "d", "e"})
        program.AddInvestment(MakeInvestment("A", name, 1, 1.5F));
    program.Expect({"a", "b", "c", "d", "e"})
        .Send(1022)
        .Answer("You must select an investment to delete!", "Ok");
    program
        .Then("select b, c, e",
              [] {
                  Program::ClickRow(1);
                  Program::ClickRow(2, Qt::ShiftModifier);
                  Program::Locked([] { Program::List()->Select(4, true); });
                  EXPECT_EQ(CountSelectedItems(Program::List()), 3);
              })
        .Send(1022)
        .Expect({"a", "d"})
        .Then("total", [] { EXPECT_EQ(Program::Total(), "Total Value: $3.00"); })
        .Then("select all", [] { Program::Locked([] { Program::List()->Select(0, 1); }); })
        .Send(1022)
        .Expect({})
        .Then("nothing", [] { EXPECT_EQ(Program::Total(), "Total Value: $0.00"); })
        .Close();
    program.Run();
    EXPECT_EQ(program.Investments(), Texts{});
    EXPECT_EQ(program.RecordSlots("invest.db"), 0);
}

TEST(NorvelWindow, CutsCopiesAndPastesBetweenPortfolios) {
    Program program;
    for (const char* name : {"From", "To"})
        program.AddPortfolio(name);
    for (const char* name : {"a", "b", "c"})
        program.AddInvestment(MakeInvestment("From", name, 1, 1));
    program.Select("From")
        .Expect({"a", "b", "c"})
        .Send(1025) // an empty clipboard pastes nothing
        .Send(1023)
        .Answer("You must select a(n) investment(s) to cut or copy.", "Ok");
    program.Then("select a, b", [] { Program::Locked([] { Program::List()->Select(0, 1); }); })
        .Send(1024)
        .Then("select b", [] { Program::Locked([] { Program::List()->Select(1); }); })
        .Then("two copied", [] { EXPECT_EQ(app_state->clipboardCount, 2); })
        .Send(1023)
        .Expect({"a", "c"})
        .Then("one cut", [] { EXPECT_EQ(app_state->clipboardCount, 1); })
        .Send(1024)
        .Answer("You must select a(n) investment(s) to cut or copy.", "Ok");
    program.Select("To")
        .Expect({})
        .Send(1025)
        .Expect({"b"})
        .Send(1025)
        .Expect({"b", "b"})
        .Then("total", [] { EXPECT_EQ(Program::Total(), "Total Value: $2.00"); })
        .Close();
    program.Run();
    EXPECT_EQ(program.Investments(), (Texts{"From/a", "From/c", "To/b", "To/b"}));
}

TEST(NorvelWindow, DeletesAPortfolioAfterTwoQuestions) {
    constexpr const char* Sure = "Are you sure you want to delete this portfolio?";
    constexpr const char* Really = "Are you really sure?";
    Program program;
    for (const char* name : {"A", "B", "C"}) {
        program.AddPortfolio(name);
        program.AddInvestment(MakeInvestment(name, std::string("in ") + name));
    }
    program.Expect({"in C"}).Send(1012).Answer(Sure, "No");
    program.Send(1012).Answer(Sure, "Yes").Answer(Really, "No");
    program.Then("nothing deleted",
                 [&] {
                     EXPECT_EQ(program.Portfolios(), (Texts{"A", "B", "C"}));
                 })
        .Select("B")
        .Expect({"in B"})
        .Send(1012)
        .Answer(Sure, "Yes")
        .Answer(Really, "Yes");
    program.Expect({"in A"})
        .Then("first is current",
              [] {
                  EXPECT_STREQ(Program::Selector()->FindMarked()->Label(), "A");
                  EXPECT_EQ(Program::Selector()->CountItems(), 2);
              })
        .Send(1012)
        .Answer(Sure, "Yes")
        .Answer(Really, "Yes");
    program.Expect({"in C"}).Send(1012).Answer(Sure, "Yes").Answer(Really, "Yes");
    program.Expect({})
        .Then("none left", [] { EXPECT_EQ(Program::Total(), "Total Value: $0.00"); })
        .Send(1012)
        .Answer("There are no portfolios to delete!", "Ok");
    program.Close();
    program.Run();
    EXPECT_EQ(program.Portfolios(), Texts{});
    EXPECT_EQ(program.RecordSlots("portfol.db"), 0);
    EXPECT_EQ(program.Investments(), Texts{});
}

TEST(NorvelWindow, CommandsThatNeedSomethingSaySo) {
    Program program;
    const char* const noPortfolio = "This command requires that a portfolio be created first.";
    for (const uint32 code : {1014U, 1016U, 1020U})
        program.Send(code).Answer(noPortfolio, "Ok");
    program.Send(1013).Answer("This command requires a portfolio with at least one investment.", "Ok");
    program.Send(1021).Answer("You must select an investment to edit!", "Ok");
    program.Close();
    program.Run();

    program.AddPortfolio("Worthless");
    program.AddInvestment(MakeInvestment("Worthless", "a", 0, 10));
    program.Expect({"a"}).Send(1013).Answer("Unable to chart. Total value of portfolio equals zero!", "Ok");
    program.Close();
    program.Run();
}

TEST(NorvelWindow, SettingsHelpAndAboutOpen) {
    static std::string launched;
    Program program;
    BRoster::SetLauncher([](const char* path) {
        launched = path;
        return true;
    });
    std::filesystem::create_directory(program.File("help"));
    program.Write("help/Quorvan.html", "help");
    program.Send(1030)
        .When(
            "help", [] { return !launched.empty(); }, [] {})
        .When("main window", Program::Main,
              [] {
                  Program::Window()->PostMessage(1000);
                  be_app->PostMessage(B_ABOUT_REQUESTED);
              })
        .Answer("Quorvan version 1.0", "Ok")
        .When("settings", Driver::WindowShown("Settings"), [] {
            EXPECT_EQ(Driver::Window("Settings")->geometry().topLeft(), QPoint(150, 150));
            auto* field = Driver::Window("Settings")->findChild<QLineEdit*>("text control");
            QTest::keyClicks(field, "abc");
            QTest::keyClick(field, Qt::Key_Return);
        });
    program.Close();
    program.Run();
    EXPECT_EQ(launched, program.Path() + "//help/Quorvan.html");
    EXPECT_NE(program.Read("Quorvan.ini").find("[GENERAL]\nPassword=abc\n"), std::string::npos);
}

TEST(NorvelWindow, WhatWasCutOnlyGoesWhenThePersonSaysSo) {
    constexpr const char* question =
        "What you cut has not been pasted yet, and would be lost. Go on all the same?";
    Program program;
    program.AddPortfolio("P");
    for (const char* name : {"a", "b", "c"})
        program.AddInvestment(MakeInvestment("P", name));
    const auto take = [&](uint32 command) {
        program.Then("the first row", [] { Program::ClickRow(0); }).Send(command);
    };
    program.Expect({"a", "b", "c"});
    take(1023);
    program.Expect({"b", "c"});
    take(1024);
    program.Answer(question, "No");
    program.Close().Answer(question, "No");
    program.Then("quit", [] { be_app->PostMessage(B_QUIT_REQUESTED); }).Answer(question, "No");
    program.Send(1025).Expect({"b", "c", "a"});
    take(1023);
    program.Expect({"c", "a"});
    take(1023);
    program.Answer(question, "Yes");
    program.Expect({"a"}).Close().Answer(question, "Yes");
    EXPECT_EQ(program.Run(), 0);
    EXPECT_EQ(program.Investments(), Texts{"P/a"});
}

} // namespace
