// A person's day without a mouse.
#include "Program.h"

#include <sstream>

#include <QKeySequence>

namespace {

class WorkingDay : public testing::Test, protected Program {
  protected:
    using Program::Run;

    // Presses keys, and types each word behind an apostrophe over what is in the field, as soon as the
    // keyboard is in the dialog or alert with this title or text; in the main window for none.
    void In(const std::string& title, const std::string& keys) {
        const auto there = [title] {
            QWidget* dialog = QApplication::activeModalWidget();
            const QString shown = Alert() ? Alert()->text() : dialog ? dialog->windowTitle() : "";
            return shown.toStdString() == title && HasKeys(dialog ? dialog : Main());
        };
        Driver::When(title + ": " + keys, there, [keys] {
            std::istringstream words(keys);
            for (std::string word; words >> word;) {
                const QKeySequence key(QString::fromStdString(word));
                word[0] == '\'' ? TypeOver(word.c_str() + 1) : Key(key[0].key(), key[0].keyboardModifiers());
            }
        });
    }

  private:
    // There is no window manager here to pass the keyboard on when another window goes.
    static bool HasKeys(QWidget* window) {
        if (!window || QApplication::activePopupWidget())
            return false;
        if (!window->isActiveWindow())
            window->activateWindow();
        return window->isActiveWindow() && QApplication::focusWidget();
    }
};

TEST_F(WorkingDay, NeedsNoMouseAndEveryRecordIsAsItShouldBe) {
    for (const std::string name : {"Now", "Later"}) {
        In("", "Alt+P A");
        In("Add a Portfolio", "'" + name + " Return");
    }
    for (const std::string what : {"'Birch&Sons Tab 'TICK Tab 'Bonds Alt+S '333.333 Tab '1.01",
                                   "'Acme Tab 'TICK Tab 'stock Alt+S '12345.678 Tab '98.7654"}) {
        In("", "Alt+I A");
        // High, the last risk; then the agent, the agents and the check mark.
        In("Add an Investment", what + " Tab Down End Return Tab 'Bank Tab Tab Space Return");
    }
    Expect({"Birch&Sons", "Acme"}, "$1,219,662.50");
    // The list's header comes after the list, and its first column is the name.
    In("", "Tab Space");
    Expect({"Acme", "Birch&Sons"});
    In("", "Shift+Tab Home B Return"); // edits the row that a typed letter has found
    In("Edit this Investment", "'Abacus Alt+S Tab '41.5 Return");
    Expect({"Acme", "Abacus"}).Then([] {
        EXPECT_EQ(RowsWidget()->currentIndex().row(), 1);
        const std::string row = Row(1)->AccessibleText();
        EXPECT_TRUE(row.starts_with("Abacus, Ticker TICK, Type Bonds, Shares 333.333, Price 41.50, ")) << row;
        EXPECT_TRUE(row.ends_with(", Retire yes, Risk High, Agent Bank, no earlier price")) << row;
    });
    // Both rows go to the other portfolio, which the selector leads to. Loaded anew, they are sorted still.
    In("", "Home Shift+Down Alt+I C");
    Expect({});
    In("", "Alt+O Home Return Alt+I P");
    Expect({"Abacus", "Acme"});
    // Buttons by their letters: the charts, and back by Escape.
    In("", "Alt+C");
    In("Quorvan", "Escape");
    In("", "Down End Return Alt+P D");
    In("Are you sure you want to delete this portfolio?", "Alt+Y");
    In("Are you really sure?", "Alt+Y");
    Expect({"Abacus", "Acme"}).Then([] { EXPECT_STREQ(Selector()->FindMarked()->Label(), "Now"); });
    In("", "Alt+P E");
    In("Edit Portfolio", "'Z\xC3\xBCrich Return");
    In("", "Ctrl+Q");
    Run();
    EXPECT_EQ(Investments(), (Texts{"Z\xC3\xBCrich/Acme", "Z\xC3\xBCrich/Abacus"}));
}

} // namespace
