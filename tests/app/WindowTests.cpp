// The main window, worked with real events.
#include "Program.h"

#include <map>

#include <QScreen>

#include "db/FaultyFiles.h"
#include "platform/MenuItem.h"

namespace {

constexpr const char* NotRead = "An investment could not be read from its file!";
constexpr const char* NotPasted =
    "What you cut has not been pasted yet, and would be lost. Go on all the same?";
constexpr const char* NoPortfolio = "This command requires that a portfolio be created first.";

enum Needs { Nothing, Portfolio, Investment };
enum Files { None, Portfolios, Investments, Both };

// Each command, in an order in which those that change files can follow each other, from a portfolio P with
// the investments a, b and c.
constexpr struct {
    uint32 code;
    Needs needs;         // or its item is grey
    const char* refusal; // what it says when there is nothing at all
    Files changes = None;
    int32 marked = -1;            // the row that it works on
    const char* rows = "";        // those that are there then
    int32 current = -1;           // and the one where the keyboard is
    const char* dialog = nullptr; // its title
    const char* name = nullptr;   // what is typed there
} Commands[] = {
    {MessageSettings, Nothing, nullptr},
    {MessageHelp, Nothing, nullptr},
    {B_ABOUT_REQUESTED, Nothing, nullptr},
    {B_QUIT_REQUESTED, Nothing, nullptr},
    {MessagePortfolioChart, Investment, "This command requires a portfolio with at least one investment."},
    {MessagePortfolioPrint, Investment, NoPortfolio},
    {MessagePortfolioUpdate, Investment, NoPortfolio},
    {MessageInvestmentCopy, Investment, NothingToTake},
    {MessageInvestmentAdd, Portfolio, NoPortfolio, Investments, -1, "abcd", 3, "Add an Investment", "d"},
    {MessageInvestmentEdit, Investment, "You must select an investment to edit!", Investments, 1, "aecd", 1,
     "Edit this Investment", "e"},
    {MessageInvestmentDelete, Investment, "You must select an investment to delete!", Investments, 0, "ecd"},
    {MessageInvestmentCut, Investment, NothingToTake, Investments, 0, "cd"},
    {MessageInvestmentPaste, Portfolio, nullptr, Investments, -1, "cde", 2},
    {MessagePortfolioEdit, Portfolio, nullptr, Both, -1, "cde", -1, "Edit Portfolio", "Q"},
    {MessagePortfolioAdd, Nothing, nullptr, Portfolios, -1, "", -1, "Add a Portfolio", "R"},
    {MessagePortfolioDelete, Portfolio, "There are no portfolios to delete!", Portfolios, -1, "cde"},
};

class MainWindow : public testing::Test, protected Program {
  protected:
    using Program::Run;

    void AddPortfolioOf(const char* name, const Texts& investments, float value = 1) const {
        AddPortfolio(name);
        for (const std::string& each : investments)
            AddInvestment(MakeInvestment(name, each, 1, value));
    }
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
    // The items, once a menu has been opened.
    static void ExpectMenus(Needs has) {
        ClickTitle(Main(), "File");
        ASSERT_TRUE(OpenMenu());
        Key(Qt::Key_Escape);
        for (const auto& each : Commands)
            EXPECT_EQ(Find<BMenuBar>()->FindItem(each.code)->IsEnabled(), each.needs <= has) << each.code;
    }
    // Runs the commands that change files, while their writes (w) or syncs (s) fail.
    void WorkOn(char failing) {
        FaultyFiles files[2];
        AddPortfolioOf("P", {"a", "b", "c"});
        Then([&] {
            files[0].Watch(app_state->portfolios, File("portfol.db"));
            files[1].Watch(app_state->investments, File("invest.db"));
            for (FaultyFiles& each : files)
                each.may = [failing](char call) { return call != failing; };
        });
        for (const auto& each : Commands) {
            if (each.changes == None)
                continue;
            if (each.code == MessagePortfolioDelete)
                DeletePortfolio("Yes", "Yes");
            else
                Mark(each.marked < 0 ? std::vector<int32>() : std::vector{each.marked}).Send(each.code);
            const auto ready = [&] { return Field() && Field()->window() == Driver::Window(each.dialog); };
            if (each.dialog)
                When(ready, [&] {
                    EXPECT_EQ(Field()->window()->geometry().topLeft(), QPoint(150, 150));
                    TypeOver(each.name, Qt::Key_Return);
                });
            if (failing)
                Answer(NotKept);
            for (const int i : {0, 1})
                if (!failing && (each.changes & (i + 1)) != 0)
                    Await([&, i] { return files[i].HaveSynced(); });
            const bool refused = failing == 'w';
            const int selected = refused && each.code == MessageInvestmentEdit ? 1 : 0;
            Await([&, refused, selected] {
                std::string letters;
                for (const std::string& name : Names())
                    letters += name;
                return letters == (refused ? "abc" : each.rows) && CountSelectedItems(List()) == selected &&
                       (refused || each.current < 0 || List()->CurrentRow() == each.current);
            });
        }
        Close();
        if (failing)
            Answer(NotPasted, "Yes"); // it is no less the only copy
        Run();
    }
};

TEST_F(MainWindow, WhatACommandChangesIsOnTheDiskWhenItEnds) {
    WorkOn('\0');
}

TEST_F(MainWindow, ADiskThatIsFoundToFailLaterIsTold) {
    WorkOn('s');
}

TEST_F(MainWindow, ADiskThatFailsLeavesEverythingAsItWas) {
    WorkOn('w');
    EXPECT_EQ(Portfolios(), Texts{"P"});
    EXPECT_EQ(Investments(), (Texts{"P/a", "P/b", "P/c"}));
}

TEST_F(MainWindow, ShowsAPortfolioAndOffersWhatCanBeDoneWithIt) {
    AddPortfolio("Empty");
    AddPortfolioOf("Full", {"a", "b", "c", "d", "e"}, 123456.75F);
    AddPortfolioOf("Worthless", {"f"}, 0);
    Expect({"f"}, "$0.00").Then([] {
        EXPECT_EQ(Marked(), "Worthless");
        ExpectMenus(Investment);
    });
    Send(MessagePortfolioChart).Answer("Unable to chart. Total value of portfolio equals zero!");
    DeletePortfolio("No", nullptr);
    DeletePortfolio("Yes", "No");
    Select("Full").Expect({"a", "b", "c", "d", "e"}, "$617,283.75");
    Mark({1, 2, 4}).Send(MessageInvestmentDelete).Expect({"a", "d"}, "$246,913.50");
    DeletePortfolio("Yes", "Yes");
    Expect({}, "$0.00").Then([] {
        EXPECT_EQ(Marked(), "Empty");
        ExpectMenus(Portfolio);
    });
    DeletePortfolio("Yes", "Yes");
    Expect({"f"});
    DeletePortfolio("Yes", "Yes");
    Expect({}, "$0.00");
    RunAndClose();
    EXPECT_EQ(Portfolios().size() + Investments().size(), 0U);
}

TEST_F(MainWindow, WithoutAPortfolioSaysWhatACommandLacksAndHelps) {
    Then([] {
        ExpectMenus(Nothing);
        EXPECT_EQ(Marked(), "");
        EXPECT_STREQ(Selector()->Name(), "        ");
        Press(Main(), "add button");
    });
    Answer(NoPortfolio);
    for (const auto& each : Commands)
        if (each.refusal)
            Send(each.code).Answer(each.refusal);
    static std::string launched;
    BRoster::SetLauncher([](const char* path) { return !(launched = path).empty(); });
    std::filesystem::create_directory(File("help"));
    Write("help/Quorvan.html", "help");
    Send(MessageHelp).Await([] { return !launched.empty(); }).RunAndClose();
    EXPECT_EQ(launched, Path() + "//help/Quorvan.html");
}

TEST_F(MainWindow, TheTotalStandsClearOfTheSelector) {
    AddPortfolio("WWWWWWWWWWWWWWWWWWWWWWWWWWWWWWW");
    AddPortfolio("i");
    Then([] {
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
        Then([] { ClickRow(20); }).Select(name);
        Await([name = name] { return Names()[0] == name && CountSelectedItems(List()) == 0; });
        Then([current = current] {
            EXPECT_EQ(List()->CurrentRow(), current);
            EXPECT_EQ(List()->Bounds().top > 0, current > 0);
        });
    }
    RunAndClose();
}

TEST_F(MainWindow, OpensAsItWasLeft) {
    const std::vector<int32> order = {0, 6, 1, 2, 3, 4, 5, 7, 8, 9, 10};
    AddPortfolioOf("P", {"b", "c", "a"});
    Then([&] {
        Locked([&] {
            Window()->MoveTo(130, 140);
            Window()->ResizeTo(450, 250);
            List()->SetDisplayOrder(order.data());
            List()->SetSortKey(6);
            List()->AddSortKey(1);
            List()->SetSortMode(1, CLVSortMode::Descending);
        });
    });
    RunAndClose();
    Expect({"c", "b", "a"}).Then([&] {
        EXPECT_EQ(Window()->Frame(), BRect(130, 140, 580, 390));
        EXPECT_EQ(List()->DisplayOrder(), order);
        EXPECT_EQ(List()->PrimarySortKey(), 6);
        EXPECT_EQ(Main()->accessibleName(), "Quorvan P");
    });
    RunAndClose();
}

TEST_F(MainWindow, OpensOnTheScreenWhateverIsStored) {
    const std::tuple<std::string, std::string, std::string, int> cases[] = {
        {"1 2 3", "0 1 1 3 4 5 6 7 8 9 10", "0 77 -100000", 501},
        {"1 2 400 99999999999", "10 9 8 7 6 5 4 3 2 1 11", "1 2 x", 501},
        {"9000 9000 400 300", "", "", 401},
        {"-90 0 400 9000", "-1 1 2 3 4 5 6 7 8 9 10", "1-1", 401}};
    for (const auto& [place, order, keys, width] : cases) {
        const std::string first = "[DISPLAY]\nWindowPlace=" + place;
        Write("Quorvan.ini",
              std::string(first).append("\nColumnOrder=").append(order) + "\nSortKeys=" + keys);
        Await(
            [] { return Main() && Main()->screen()->availableGeometry().contains(Main()->frameGeometry()); });
        Then([&place = place, width = width] {
            EXPECT_EQ(Main()->width(), width) << place;
            EXPECT_EQ(List()->DisplayOrder()[10], 10);
            EXPECT_EQ(List()->PrimarySortKey(), -1);
        });
        RunAndClose();
    }
}

TEST_F(MainWindow, TellsWhatItCannotReadAndLeavesItAlone) {
    FaultyFiles files;
    AddPortfolioOf("A", {"a", "b"});
    Expect({"a", "b"}).Mark({0, 1}).Then([&] {
        files.Watch(app_state->investments, File("invest.db"));
        app_state->investments->SetReadCache(0);
        files.Arm(Fault::NoReads, 0);
    });
    Send(MessageInvestmentCopy).Answer(NotRead);
    Then([] { EXPECT_EQ(app_state->clipboardCount, 0); });
    Select("A").Answer(NotRead).Expect({}, "not known");
    DeletePortfolio("Yes", "Yes");
    Answer(NotKept).Answer(NotRead).RunAndClose();
    EXPECT_EQ(Portfolios(), Texts{"A"});
}

// The second run finds the files as the first one would leave them if it were killed after the cut.
TEST_F(MainWindow, WhatWasCutOnlyGoesWhenThePersonSaysSo) {
    std::map<std::string, std::string> files;
    AddPortfolioOf("From", {"a", "b", "c"});
    AddPortfolio("To");
    Select("From").Expect({"a", "b", "c"}).Send(MessageInvestmentPaste); // there is nothing yet
    Mark({0, 1}).Send(MessageInvestmentCopy).Await([] { return app_state->clipboardCount == 2; });
    Mark({1}).Send(MessageInvestmentCut).Expect({"a", "c"}).Then([&] {
        for (const char* name : {"portfol.db", "invest.db", "cut.db"})
            files[name] = Read(name);
    });
    Mark({0}).Send(MessageInvestmentCopy).Answer(NotPasted, "No");
    Close().Answer(NotPasted, "No");
    Then([] { be_app->PostMessage(B_QUIT_REQUESTED); }).Answer(NotPasted, "No");
    Select("To").Expect({}).Send(MessageInvestmentPaste).Expect({"b"});
    Then([this] { EXPECT_FALSE(Has("cut.db")); });
    Send(MessageInvestmentPaste).Expect({"b", "b"}, "$2.00");
    Mark({0}).Send(MessageInvestmentCut).Expect({"b"});
    Mark({0}).Send(MessageInvestmentCut).Answer(NotPasted, "Yes");
    Expect({}).Close().Answer(NotPasted, "Yes");
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Investments(), (Texts{"From/a", "From/c"}));
    for (const auto& [name, content] : files)
        Write(name, content);
    Answer("What had been cut and not pasted when Quorvan last ended is back in its portfolio.");
    Select("From").Expect({"a", "c", "b"});
    EXPECT_EQ(RunAndClose(), 0);
    EXPECT_FALSE(Has("cut.db"));
}

} // namespace
