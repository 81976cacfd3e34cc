// The main window, worked with real events.
#include "Program.h"

#include <map>

#include <QPushButton>

#include "WatchedFiles.h"
#include "platform/MenuItem.h"
#include "platform/Roster.h"

namespace {

class MainWindow : public testing::Test, protected Program {
  protected:
    // A portfolio with an investment of each of these names, of equal value.
    void AddPortfolioOf(const char* name, const Texts& investments, float value = 1) const {
        AddPortfolio(name);
        for (const std::string& each : investments)
            AddInvestment(MakeInvestment(name, each, 1, value));
    }
    // A step that sends a command and answers the alert that it leads to.
    void Refused(uint32 code, const char* text) { Send(code).Answer(text, "Ok"); }
    // Steps that delete the current portfolio, up to an answer other than Yes.
    void DeletePortfolio(const char* first, const char* second) {
        Send(MessagePortfolioDelete).Answer("Are you sure you want to delete this portfolio?", first);
        if (second)
            Answer("Are you really sure?", second);
    }
    static std::string Marked() {
        const BMenuItem* marked = Selector()->FindMarked();
        return marked ? marked->Label() : "";
    }
};

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

// The items, once each menu has been opened.
void ExpectMenus(bool MenuState::*state) {
    for (const char* menu : {"File", "Portfolio", "Investment", "Help"}) {
        Driver::ClickTitle(Program::Main(), menu);
        ASSERT_TRUE(Driver::OpenMenu());
        Driver::Key(Qt::Key_Escape);
    }
    for (const MenuState& each : MenuStates)
        EXPECT_EQ(Program::Find<BMenuBar>()->FindItem(each.code)->IsEnabled(), each.*state) << each.code;
}

TEST_F(MainWindow, ShowsAPortfolioAndOffersWhatCanBeDoneWithIt) {
    for (const char* name : {"Empty", "First one", "Second"})
        AddPortfolio(name);
    AddInvestment(MakeInvestment("First one", "a", 1000, 1234.5F));
    AddInvestment(MakeInvestment("Second", "b", 1, 2));
    AddInvestment(MakeInvestment("First one", "c", 1, 0.25F));
    Expect({"b"}, "$2.00").Then("start", [] {
        EXPECT_EQ(Marked(), "Second");
        EXPECT_EQ(Selector()->CountItems(), 3);
        ExpectMenus(&MenuState::investments);
    });
    Select("First one").Expect({"a", "c"}, "$1,234,500.25");
    Select("Empty").Expect({}, "$0.00").Then("without investments", [] {
        EXPECT_EQ(Marked(), "Empty");
        ExpectMenus(&MenuState::noInvestment);
    });
    RunAndClose();
}

TEST_F(MainWindow, SaysWhatACommandLacks) {
    constexpr const char* noPortfolio = "This command requires that a portfolio be created first.";
    Then("without portfolios", [] {
        ExpectMenus(&MenuState::noPortfolio);
        EXPECT_EQ(Marked(), "");
        EXPECT_STREQ(Selector()->Name(), "        ");
        Press(Main(), "add button");
    }).Answer(noPortfolio, "Ok");
    for (const uint32 code : {MessagePortfolioPrint, MessagePortfolioUpdate, MessageInvestmentAdd})
        Refused(code, noPortfolio);
    Refused(MessagePortfolioChart, "This command requires a portfolio with at least one investment.");
    Refused(MessagePortfolioDelete, "There are no portfolios to delete!");
    Refused(MessageInvestmentEdit, "You must select an investment to edit!");
    RunAndClose();

    AddPortfolioOf("Worthless", {"a"}, 0);
    Expect({"a"});
    Refused(MessagePortfolioChart, "Unable to chart. Total value of portfolio equals zero!");
    Refused(MessageInvestmentDelete, "You must select an investment to delete!");
    RunAndClose();
}

TEST_F(MainWindow, TheTotalStandsClearOfTheSelector) {
    AddPortfolio("WWWWWWWWWWWWWWWWWWWWWWWWWWWWWWW");
    AddPortfolio("i");
    Then("short name", [] {
        const auto* field = Find<BMenuField>();
        EXPECT_EQ(Find<BStringView>()->Frame().left, 200);
        EXPECT_LT(field->VisibleRight(), 190);
        Locked([] { Selector()->ItemAt(0)->SetMarked(true); });
        EXPECT_GT(field->VisibleRight(), 190);
        EXPECT_EQ(Find<BStringView>()->Frame().left, field->VisibleRight() + 10);
    });
    RunAndClose();
}

TEST_F(MainWindow, AListLoadedAnewKeepsItsPlaceAndAnotherBegins) {
    for (const char* name : {"Other", "P"})
        AddPortfolioOf(name, Texts(30, name));
    for (const auto& [name, current] : {std::pair{"P", 20}, {"Other", -1}}) {
        Then(
            "scroll", [] { ClickRow(20); })
            .Select(name);
        Await(name, [name = name] { return Names()[0] == name && CountSelectedItems(List()) == 0; });
        Then("loaded", [current = current] {
            EXPECT_EQ(List()->CurrentRow(), current);
            EXPECT_EQ(List()->Bounds().top > 0, current > 0);
        });
    }
    RunAndClose();
}

TEST_F(MainWindow, AClickOnAHeaderSortsByText) {
    AddPortfolio("A");
    for (const auto& [name, value] : {std::pair{"b", 980.F}, {"a", 1250.F}, {"C", 7.F}, {"d", 12345.F}})
        AddInvestment(MakeInvestment("A", name, 1, value));
    const auto click = [this](InvestmentColumn column) {
        Then("click", [column] {
            const CLVColumn* clicked = List()->ColumnAt(static_cast<int32>(column));
            QTest::mouseClick(Main()->findChild<QWidget*>("column labels"), Qt::LeftButton, {},
                              QPoint(static_cast<int>((clicked->Begin() + clicked->End()) / 2), 8));
        });
    };
    Expect({"b", "a", "C", "d"});
    click(InvestmentColumn::Value);
    Expect({"d", "a", "C", "b"}); // "12,345.00", "1250.00", "7.00", "980.00"
    click(InvestmentColumn::Name);
    Expect({"a", "b", "C", "d"});
    click(InvestmentColumn::Name);
    Expect({"d", "C", "b", "a"}).Select("A").Expect({"d", "C", "b", "a"}); // loaded anew, and still sorted
    RunAndClose();
}

TEST_F(MainWindow, DeletesTheSelectedInvestments) {
    AddPortfolioOf("A", {"a", "b", "c", "d", "e"}, 1.5F);
    Expect({"a", "b", "c", "d", "e"}).Then("select b, c, e", [] {
        ClickRow(1);
        ClickRow(2, Qt::ShiftModifier);
        Locked([] { List()->Select(4, true); });
        EXPECT_EQ(CountSelectedItems(List()), 3);
    });
    Send(MessageInvestmentDelete).Expect({"a", "d"}, "$3.00");
    Mark({0, 1}).Send(MessageInvestmentDelete).Expect({}, "$0.00");
    RunAndClose();
    EXPECT_EQ(RecordSlots("invest.db"), 0);
}

TEST_F(MainWindow, CutsCopiesAndPastesBetweenPortfolios) {
    constexpr const char* nothing = "You must select a(n) investment(s) to cut or copy.";
    AddPortfolioOf("From", {"a", "b", "c"});
    AddPortfolio("To");
    Select("From").Expect({"a", "b", "c"}).Send(MessageInvestmentPaste); // there is nothing yet
    Refused(MessageInvestmentCut, nothing);
    Mark({0, 1}).Send(MessageInvestmentCopy);
    When(
        "two copied", [] { return app_state->clipboardCount == 2; }, [] {});
    Mark({1}).Send(MessageInvestmentCut).Expect({"a", "c"});
    Refused(MessageInvestmentCopy, nothing);
    Select("To").Expect({}).Send(MessageInvestmentPaste).Expect({"b"});
    Send(MessageInvestmentPaste).Expect({"b", "b"}, "$2.00");
    RunAndClose();
    EXPECT_EQ(Investments(), (Texts{"From/a", "From/c", "To/b", "To/b"}));
}

TEST_F(MainWindow, DeletesAPortfolioAfterTwoQuestions) {
    for (const char* name : {"A", "B", "C"})
        AddPortfolioOf(name, {std::string("in ") + name});
    Expect({"in C"});
    DeletePortfolio("No", nullptr);
    DeletePortfolio("Yes", "No");
    Then("nothing deleted", [this] { EXPECT_EQ(Portfolios().size(), 3U); });
    Select("B").Expect({"in B"});
    DeletePortfolio("Yes", "Yes");
    Expect({"in A"}).Then("first is current", [] {
        EXPECT_EQ(Marked(), "A");
        EXPECT_EQ(Selector()->CountItems(), 2);
    });
    DeletePortfolio("Yes", "Yes");
    Expect({"in C"});
    DeletePortfolio("Yes", "Yes");
    Expect({}, "$0.00");
    RunAndClose();
    EXPECT_EQ(RecordSlots("portfol.db") + RecordSlots("invest.db"), 0);
}

TEST_F(MainWindow, TellsWhatItCannotReadAndLeavesItAlone) {
    WatchedFiles files;
    AddPortfolioOf("A", {"a", "b"});
    const char* notRead = "An investment could not be read from its file!";
    Expect({"a", "b"}).Mark({0, 1}).Then("the disk fails", [&] {
        files.Watch(app_state->investments, File("invest.db"));
        app_state->investments->SetReadCache(0);
        files.reads = 1;
    });
    Refused(MessageInvestmentCopy, notRead);
    Then("nothing copied", [] { EXPECT_EQ(app_state->clipboardCount, 0); });
    Select("A").Answer(notRead, "Ok");
    Expect({}, "not known");
    DeletePortfolio("Yes", "Yes");
    Answer("The change could not be saved! Is the disk full, or the file protected?", "Ok");
    Answer(notRead, "Ok");
    RunAndClose();
    EXPECT_EQ(Portfolios(), Texts{"A"});
}

TEST_F(MainWindow, SettingsHelpAndAboutOpen) {
    static std::string launched;
    BRoster::SetLauncher([](const char* path) {
        launched = path;
        return true;
    });
    std::filesystem::create_directory(File("help"));
    Write("help/Quorvan.html", "help");
    Send(MessageHelp).Await("help", [] { return !launched.empty(); });
    Then("main window",
         [] {
             Window()->PostMessage(1000);
             be_app->PostMessage(B_ABOUT_REQUESTED);
         })
        .Answer("Quorvan version 1.0\n\nThe manual is the file help/Quorvan.html in your Quorvan folder. "
                "Help opens it in your web browser.",
                "Ok");
    When("settings", WindowShown("Settings"), [] {
        EXPECT_EQ(Driver::Window("Settings")->geometry().topLeft(), QPoint(150, 150));
        auto* field = Driver::Window("Settings")->findChild<QLineEdit*>();
        QTest::keyClicks(field, "abc");
        QTest::keyClick(field, Qt::Key_Return);
    });
    RunAndClose();
    EXPECT_EQ(launched, Path() + "//help/Quorvan.html");
    EXPECT_NE(Read("Quorvan.ini").find("[GENERAL]\nPassword=abc\n"), std::string::npos);
}

TEST_F(MainWindow, WhatWasCutOnlyGoesWhenThePersonSaysSo) {
    constexpr const char* question =
        "What you cut has not been pasted yet, and would be lost. Go on all the same?";
    AddPortfolioOf("P", {"a", "b", "c"});
    const auto take = [&](uint32 command) { Mark({0}).Send(command); };
    Expect({"a", "b", "c"});
    take(MessageInvestmentCut);
    Expect({"b", "c"});
    take(MessageInvestmentCopy);
    Answer(question, "No");
    Close().Answer(question, "No");
    Then("quit", [] { be_app->PostMessage(B_QUIT_REQUESTED); }).Answer(question, "No");
    Send(MessageInvestmentPaste).Expect({"b", "c", "a"});
    take(MessageInvestmentCut);
    Expect({"c", "a"});
    take(MessageInvestmentCut);
    Answer(question, "Yes");
    Expect({"a"}).Close().Answer(question, "Yes");
    EXPECT_EQ(Program::Run(), 0);
    EXPECT_EQ(Investments(), Texts{"P/a"});
}

// The second program finds the files as the first one would leave them if it were killed after the cut.
TEST(CutInvestments, ComeBackAtTheNextStart) {
    std::map<std::string, std::string> files;
    {
        Program killed;
        killed.AddPortfolio("P");
        for (const char* name : {"a", "b", "c"})
            killed.AddInvestment(MakeInvestment("P", name));
        killed.Expect({"a", "b", "c"}).Mark({0, 2}).Send(MessageInvestmentCut).Expect({"b"});
        killed.Then("kept", [&] {
            for (const char* name : {"portfol.db", "invest.db", "cut.db"})
                files[name] = killed.Read(name);
        });
        killed.Send(MessageInvestmentPaste).Expect({"b", "a", "c"});
        killed.Then("pasted", [&] { EXPECT_FALSE(killed.Has("cut.db")); });
        EXPECT_EQ(killed.RunAndClose(), 0);
    }
    Program next;
    for (const auto& [name, content] : files)
        next.Write(name, content);
    next.Answer("What had been cut and not pasted when Quorvan last ended is back in its portfolio.", "Ok");
    next.Expect({"b", "a", "c"});
    EXPECT_EQ(next.RunAndClose(), 0);
    EXPECT_FALSE(next.Has("cut.db"));
}

TEST_F(MainWindow, WhatACommandChangesIsOnTheDiskWhenItEnds) {
    WatchedFiles portfolios;
    WatchedFiles investments;
    AddPortfolioOf("P", {"a", "b", "c"});
    Then(
        "watch the files",
        [&] {
            portfolios.Watch(app_state->portfolios, File("portfol.db"));
            investments.Watch(app_state->investments, File("invest.db"));
        });
    const auto done = [&](WatchedFiles& files) {
        Await(
            "on the disk", [&] { return files.HaveSynced(); });
    };
    const auto fill = [&](uint32 command, const char* title, const char* name) {
        Send(command).When(
            title, [title] { return Field() && WindowShown(title)(); },
            [name] { TypeOver(name, Qt::Key_Return); });
    };
    const auto shown = [&](int32 row) {
        Await("current", [row] { return List()->CurrentRow() == row && CountSelectedItems(List()) == 0; });
    };
    Mark({0}).Send(MessageInvestmentDelete).Expect({"b", "c"});
    done(investments);
    Mark({0}).Send(MessageInvestmentCut).Expect({"c"});
    done(investments);
    Then("what is pasted is there before its copy goes",
         [&] { investments.beforeSync = [this] { EXPECT_TRUE(Has("cut.db")); }; });
    Send(MessageInvestmentPaste).Expect({"c", "b"});
    Then("pasted", [&] { investments.beforeSync = nullptr; });
    shown(1);
    done(investments);
    Mark({1});
    fill(MessageInvestmentEdit, "Edit this Investment", "e");
    done(investments);
    shown(1);
    fill(MessageInvestmentAdd, "Add an Investment", "d");
    done(investments);
    shown(2);
    fill(MessagePortfolioEdit, "Edit Portfolio", "Q");
    done(portfolios);
    done(investments);
    fill(MessagePortfolioAdd, "Add a Portfolio", "R");
    done(portfolios);
    Expect({});
    DeletePortfolio("Yes", "Yes");
    done(portfolios);
    Expect({"c", "e", "d"});
    RunAndClose();
}

TEST_F(MainWindow, ADiskThatFailsIsToldOnce) {
    WatchedFiles investments;
    AddPortfolioOf("P", {"a", "b"});
    Then(
        "watch the file", [&] { investments.Watch(app_state->investments, File("invest.db")); });
    const auto fails = [&](uint32 command) {
        Then("the disk fails", [&] { investments.failing = true; });
        Send(command).Answer("The change could not be saved! Is the disk full, or the file protected?", "Ok");
        Then("told", [&] { investments.failing = false; });
    };
    Mark({0});
    fails(MessageInvestmentCut);
    fails(MessageInvestmentPaste);
    Expect({"b", "a"})
        .Then(
            "kept", [&] { EXPECT_TRUE(Has("cut.db")); });
    Mark({0}).Send(MessageInvestmentDelete).Expect({"a"}).Await("on the disk", [&] {
        return investments.HaveSynced();
    });
    Close().Answer("What you cut has not been pasted yet, and would be lost. Go on all the same?", "Yes");
    Program::Run();
}

} // namespace
