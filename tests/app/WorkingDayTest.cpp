// A person's day without a mouse. In the end every record is looked at byte by byte.
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
        EXPECT_STREQ(Row(1)->Text(5), "41.50");
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
    const char* last = "Z\xC3\xBCrich";
    EXPECT_EQ(Portfolios(), Texts{last});
    DATABASE file(File("invest.db").c_str());
    INVESTMENT_DATA expected[] = {MakeInvestment(last, "Acme", 12345.678F, 98.7654F, "stock"),
                                  MakeInvestment(last, "Abacus", 333.333F, 41.5F, "Bonds")};
    for (long place = 0; place < 2; ++place) {
        CopyTextZeroed(expected[place].Risk, "High");
        expected[place].Retire = 1;
        expected[place].Date = Today();
        INVESTMENT_DATA record{};
        ASSERT_EQ(file.Read(place, &record), 1);
        EXPECT_EQ(std::memcmp(&record, &expected[place], offsetof(INVESTMENT_DATA, Unused)), 0) << place;
    }
}

} // namespace
