// A person's whole working day without a mouse: every command is reached by menu letters, Tab, arrows, Space,
// Enter and Escape. In the end every record is looked at byte by byte.
#include "Program.h"

namespace {

// With letters of more than one byte.
constexpr const char* Mueller = "M\xC3\xBCller";
constexpr const char* Zurich = "Z\xC3\xBCrich";

// Whether keys reach the window. There is no window manager here to pass them on when another window goes.
bool HasKeys(QWidget* window) {
    if (!window || QApplication::activePopupWidget())
        return false;
    if (!window->isActiveWindow())
        window->activateWindow();
    return window->isActiveWindow() && QApplication::focusWidget();
}

class WorkingDay : public testing::Test, protected Program {
  protected:
    using Program::Run;

    void InMain(Action action) {
        When(
            "the main window's keys", [] { return !QApplication::activeModalWidget() && HasKeys(Main()); },
            std::move(action));
    }
    void Press(Qt::Key key, Qt::KeyboardModifiers with = {}) {
        InMain([key, with] { Key(key, with); });
    }
    // In the menu that is opened next.
    void PressInMenu(std::vector<Qt::Key> keys) {
        When(
            "a menu", [] { return OpenMenu() && OpenMenu()->activeAction(); },
            [keys = std::move(keys)] {
                for (const Qt::Key key : keys)
                    Key(key);
            });
    }
    // Opens a menu by its letter and takes the item with the letter.
    void Choose(Qt::Key menu, Qt::Key item) {
        Press(menu, Qt::AltModifier);
        PressInMenu({item});
    }
    // As soon as the keyboard is in a dialog or an alert with this title or text.
    void In(const char* title, Action action) {
        When(
            std::string("dialog: ") + title,
            [title] {
                QWidget* dialog = QApplication::activeModalWidget();
                return dialog && (Alert() ? Alert()->text() : dialog->windowTitle()) == title &&
                       HasKeys(dialog);
            },
            std::move(action));
    }
    // Gives the current or a new portfolio a name.
    void Name(Qt::Key command, const char* title, const char* name) {
        Choose(Qt::Key_P, command);
        In(title, [name] { TypeOver(name, Qt::Key_Return); });
        Await(std::string("portfolio ") + name, [name] {
            const BMenuItem* marked = Selector()->FindMarked();
            return marked && marked->Label() == std::string(name) && !QApplication::activeModalWidget();
        });
    }
    // Fills the form with what makes the record: over the pick list of types to Shares by its letter, and
    // back from the agent to Risk, where High is below the marked Med.
    void Add(const INVESTMENT_DATA& record, const char* shares, const char* price) {
        Choose(Qt::Key_I, Qt::Key_A);
        const char* title = "Add an Investment";
        In(title, [&record, shares, price] {
            Type(record.Name, Qt::Key_Tab);
            Type(record.Ticker, Qt::Key_Tab);
            Type(record.Type);
            Key(Qt::Key_S, Qt::AltModifier);
            TypeOver(shares, Qt::Key_Tab);
            TypeOver(price, Qt::Key_Tab);
            Key(Qt::Key_Tab);
            Type(record.Agent);
            Key(Qt::Key_Tab, Qt::ShiftModifier);
            Key(Qt::Key_Down);
        });
        PressInMenu({Qt::Key_Down, Qt::Key_Return});
        In(
            title, [] { Key(Qt::Key_E, Qt::AltModifier); }); // Retirement
        When(
            "the check mark",
            [title] {
                return Driver::Window(title)->findChild<QAbstractButton*>("retirement check")->isChecked();
            },
            [] { Key(Qt::Key_Return); });
    }
    void ToTheList() {
        InMain([] {
            for (int steps = 0; steps < 10 && QApplication::focusWidget() != RowsWidget(); ++steps)
                Key(Qt::Key_Tab);
        });
    }
};

TEST_F(WorkingDay, NeedsNoMouseAndEveryRecordIsAsItShouldBe) {
    Name(Qt::Key_A, "Add a Portfolio", "Later");
    Name(Qt::Key_A, "Add a Portfolio", "Now");
    INVESTMENT_DATA birch = MakeInvestment("Later", "Birch & Sons", 333.333F, 1.01F, "Bond Fund");
    INVESTMENT_DATA acme = MakeInvestment("Later", "Acme", 12345.678F, 98.7654F, "stock");
    INVESTMENT_DATA mueller = MakeInvestment("Now", Mueller, 1000, 0.25F);
    for (INVESTMENT_DATA* each : {&birch, &acme, &mueller}) {
        CopyTextZeroed(each->Risk, "High");
        each->Retire = 1;
        each->Date = Today();
    }
    Add(birch, "333.333", "1.01");
    Add(acme, "12345.678", "98.7654");
    Add(mueller, "1e3", "0.25");
    Expect({birch.Name, acme.Name, Mueller}, "$1,219,912.50");
    // The list's header comes after the list, and its first column is the name.
    ToTheList();
    Press(Qt::Key_Tab);
    Press(Qt::Key_Space);
    Expect({acme.Name, birch.Name, Mueller});
    // Enter edits the row that a typed letter has found; Escape leaves it as it was.
    ToTheList();
    for (const Qt::Key key : {Qt::Key_Home, Qt::Key_M, Qt::Key_Return})
        Press(key);
    In("Edit this Investment", [] { Type("not kept", Qt::Key_Escape); });
    Expect({acme.Name, birch.Name, Mueller});
    Press(Qt::Key_Return);
    In("Edit this Investment", [] {
        Type("Cypress");
        Key(Qt::Key_S, Qt::AltModifier);
        Key(Qt::Key_Tab);
        TypeOver("41.5", Qt::Key_Return);
    });
    Expect({acme.Name, birch.Name, "Cypress"}).Then("the row that was edited", [] {
        EXPECT_EQ(RowsWidget()->currentIndex().row(), 2);
        EXPECT_STREQ(Row(2)->Text(5), "41.50");
    });
    // Two rows go to the other portfolio.
    ToTheList();
    Press(Qt::Key_Home);
    Press(Qt::Key_Down, Qt::ShiftModifier);
    Choose(Qt::Key_I, Qt::Key_C);
    Expect({"Cypress"});
    Press(Qt::Key_O, Qt::AltModifier); // the selector
    PressInMenu({Qt::Key_Up, Qt::Key_Return});
    Expect({});
    Choose(Qt::Key_I, Qt::Key_P);
    Expect({acme.Name, birch.Name});
    Press(Qt::Key_Down);
    PressInMenu({Qt::Key_Down, Qt::Key_Return});
    Expect({"Cypress"});
    // Buttons by their letters: the charts, and back by Escape.
    Press(Qt::Key_C, Qt::AltModifier);
    In("Quorvan", [] { QTest::keyClick(QApplication::activeModalWidget(), Qt::Key_Escape); });
    Choose(Qt::Key_P, Qt::Key_D);
    for (const char* question : {"Are you sure you want to delete this portfolio?", "Are you really sure?"})
        In(question, [] { QTest::keyClick(Alert(), Qt::Key_Y, Qt::AltModifier); });
    Expect({acme.Name, birch.Name});
    Name(Qt::Key_E, "Edit Portfolio", Zurich);
    Press(Qt::Key_Q, Qt::ControlModifier);
    Run();
    EXPECT_EQ(Portfolios(), Texts{Zurich});
    for (INVESTMENT_DATA* each : {&birch, &acme})
        CopyTextZeroed(each->Portfolio, Zurich);
    DATABASE file(File("invest.db").c_str());
    EXPECT_EQ(RecordSlots("invest.db"), 2);
    for (const auto& [place, expected] : {std::pair{0, acme}, {1, birch}}) {
        INVESTMENT_DATA record{};
        ASSERT_EQ(file.Read(place, &record), 1);
        EXPECT_EQ(std::memcmp(&record, &expected, offsetof(INVESTMENT_DATA, Unused)), 0) << record.Name;
    }
}

} // namespace
