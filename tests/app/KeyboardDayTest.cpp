// A working day without a mouse: every command is reached by menu letters, Tab, arrows, Space, Enter and
// Escape.
#include "Program.h"

namespace {

// Whether keys reach the window. There is no window manager here to pass them on when another window goes.
bool HasKeys(QWidget* window) {
    if (!window || QApplication::activePopupWidget())
        return false;
    if (!window->isActiveWindow())
        window->activateWindow();
    return window->isActiveWindow();
}

bool MainHasKeys() {
    return !QApplication::activeModalWidget() && HasKeys(Program::Main()) && QApplication::focusWidget();
}

class KeyboardDay : public testing::Test, protected Program {
  protected:
    using Program::Run;

    void Press(Qt::Key key, Qt::KeyboardModifiers with = {}) {
        When(
            "the main window's keys", MainHasKeys, [key, with] { Key(key, with); });
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
    void AddPortfolioByKeys(const char* name) {
        Choose(Qt::Key_P, Qt::Key_A);
        In("Add a Portfolio", [name] { Type(name, Qt::Key_Return); });
        Showing(name);
    }
    void AddByKeys(const char* name, const char* shares) {
        Choose(Qt::Key_I, Qt::Key_A);
        In("Add an Investment", [name, shares] {
            Type(name);
            Key(Qt::Key_S, Qt::AltModifier); // to Shares
            Type(shares, Qt::Key_Tab);
            Type("2", Qt::Key_Tab); // to Risk: opened by Down, High is below the marked Med
            Key(Qt::Key_Down);
        });
        PressInMenu({Qt::Key_Down, Qt::Key_Return});
        In(
            "Add an Investment", [] { Key(Qt::Key_E, Qt::AltModifier); }); // Retirement
        When(
            "the check mark",
            [] {
                return Driver::Window("Add an Investment")
                    ->findChild<QAbstractButton*>("retirement check")
                    ->isChecked();
            },
            [] { Key(Qt::Key_Return); });
    }
    void Showing(const char* portfolio) {
        Await(
            std::string("portfolio ") + portfolio,
            [portfolio] {
                const BMenuItem* marked = Selector()->FindMarked();
                return marked && marked->Label() == std::string(portfolio) &&
                       !QApplication::activeModalWidget();
            });
    }
    void ToTheList() {
        When(
            "to the list", MainHasKeys,
            [] {
                for (int steps = 0; steps < 10 && QApplication::focusWidget() != RowsWidget(); ++steps)
                    Key(Qt::Key_Tab);
                EXPECT_EQ(QApplication::focusWidget(), RowsWidget());
            });
    }
};

TEST_F(KeyboardDay, NeedsNoMouse) {
    AddPortfolioByKeys("Later");
    AddPortfolioByKeys("Now");
    Texts all;
    for (const auto& [name, shares] : {std::pair{"Birch", "10"}, {"Acme", "20"}, {"Cedar", "5"}}) {
        AddByKeys(name, shares);
        all.emplace_back(name);
        Expect(all);
    }
    Expect(all, "$70.00").Then("risk and retirement", [] {
        EXPECT_STREQ(Row(0)->Text(9), "High");
        EXPECT_STREQ(Row(0)->Text(8), "yes");
    });
    // The list's header comes after the list, and its first column is the name.
    ToTheList();
    Press(Qt::Key_Tab);
    Press(Qt::Key_Space);
    Expect({"Acme", "Birch", "Cedar"});
    // Enter edits the row that a typed letter has found; Escape leaves it as it was.
    ToTheList();
    for (const Qt::Key key : {Qt::Key_Home, Qt::Key_C, Qt::Key_Return})
        Press(key);
    In("Edit this Investment", [] { Type("not kept", Qt::Key_Escape); });
    Expect({"Acme", "Birch", "Cedar"});
    Press(Qt::Key_Return);
    In(
        "Edit this Investment", [] { Type("Cypress", Qt::Key_Return); });
    Expect({"Acme", "Birch", "Cypress"}).Then("the row that was edited", [] {
        EXPECT_EQ(RowsWidget()->currentIndex().row(), 2);
    });
    // Two rows go to the other portfolio.
    ToTheList();
    Press(Qt::Key_Home);
    Press(Qt::Key_Down, Qt::ShiftModifier);
    Choose(Qt::Key_I, Qt::Key_C);
    Expect({"Cypress"});
    Press(Qt::Key_O, Qt::AltModifier); // the selector
    PressInMenu({Qt::Key_Up, Qt::Key_Return});
    Showing("Later");
    Expect({});
    Choose(Qt::Key_I, Qt::Key_P);
    Expect({"Acme", "Birch"});
    Press(Qt::Key_Down);
    PressInMenu({Qt::Key_Down, Qt::Key_Return});
    Showing("Now");
    Expect({"Cypress"});
    // Buttons by their letters: the charts, and back by Escape.
    Press(Qt::Key_C, Qt::AltModifier);
    In("Quorvan", [] { QTest::keyClick(QApplication::activeModalWidget(), Qt::Key_Escape); });
    Choose(Qt::Key_P, Qt::Key_D);
    for (const char* question : {"Are you sure you want to delete this portfolio?", "Are you really sure?"})
        In(question, [] { QTest::keyClick(Alert(), Qt::Key_Y, Qt::AltModifier); });
    Showing("Later");
    Expect({"Acme", "Birch"});
    Press(Qt::Key_Q, Qt::ControlModifier);
    Run();
    EXPECT_EQ(Portfolios(), Texts{"Later"});
    EXPECT_EQ(Investments(), (Texts{"Later/Acme", "Later/Birch"}));
}

} // namespace
