// A working day without a mouse: every command is reached by menu letters, Tab, arrows, Space, Enter and
// Escape.
#include "Program.h"

#include <QLineEdit>
#include <QMenu>

namespace {

void Key(Qt::Key key, Qt::KeyboardModifiers with = {}) {
    QWidget* at =
        QApplication::activePopupWidget() ? QApplication::activePopupWidget() : QApplication::focusWidget();
    ASSERT_TRUE(at);
    QTest::keyClick(at, key, with);
}

void Type(const char* text) {
    for (const QChar letter : QString::fromUtf8(text))
        QTest::sendKeyEvent(QTest::Click, QApplication::focusWidget(), Qt::Key_unknown, QString(letter),
                            Qt::NoModifier);
}

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

class KeyboardDay : public Program {
  public:
    KeyboardDay& Press(Qt::Key key, Qt::KeyboardModifiers with = {}) {
        When("the main window's keys", MainHasKeys, [key, with] { Key(key, with); });
        return *this;
    }
    // Opens a menu by its letter and takes the item with the letter.
    KeyboardDay& Choose(Qt::Key menu, Qt::Key item) {
        Press(menu, Qt::AltModifier);
        When(
            "a menu", [] { return QApplication::activePopupWidget() != nullptr; }, [item] { Key(item); });
        return *this;
    }
    // As soon as the keyboard is in a dialog with this title.
    KeyboardDay& In(const char* title, Action action) {
        When(
            std::string("dialog: ") + title,
            [title] {
                QWidget* dialog = QApplication::activeModalWidget();
                return dialog && dialog->windowTitle() == title && HasKeys(dialog);
            },
            std::move(action));
        return *this;
    }
    KeyboardDay& AddPortfolioByKeys(const char* name) {
        Choose(Qt::Key_P, Qt::Key_A).In("Add a Portfolio", [name] {
            Type(name);
            Key(Qt::Key_Return);
        });
        return Showing(name);
    }
    KeyboardDay& AddByKeys(const char* name, const char* shares) {
        Choose(Qt::Key_I, Qt::Key_A).In("Add an Investment", [name, shares] {
            Type(name);
            Key(Qt::Key_S, Qt::AltModifier); // to Shares
            Type(shares);
            Key(Qt::Key_Tab);
            Type("2");
            Key(Qt::Key_Tab); // Risk: opened by Down, High is below the marked Med
            Key(Qt::Key_Down);
        });
        When(
            "the risks", [] { return QApplication::activePopupWidget() != nullptr; },
            [] {
                Key(Qt::Key_Down);
                Key(Qt::Key_Return);
            });
        In("Add an Investment", [] { Key(Qt::Key_E, Qt::AltModifier); }); // Retirement
        When(
            "the check mark",
            [] {
                return Driver::Window("Add an Investment")
                    ->findChild<QAbstractButton*>("retirement check")
                    ->isChecked();
            },
            [] { Key(Qt::Key_Return); });
        return *this;
    }
    KeyboardDay& Expect(const Texts& names) {
        Program::Expect(names);
        return *this;
    }
    KeyboardDay& Showing(const char* portfolio) {
        When(
            std::string("portfolio ") + portfolio,
            [portfolio] {
                const BMenuItem* marked = Selector()->FindMarked();
                return marked && marked->Label() == std::string(portfolio) &&
                       !QApplication::activeModalWidget();
            },
            [] {});
        return *this;
    }
    // In the selector's menu, which a key has opened, goes up or down from the marked portfolio.
    KeyboardDay& Switch(Qt::Key way, const char* portfolio) {
        When(
            "the selector's menu",
            [] {
                const auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
                return menu && menu->activeAction();
            },
            [way] {
                Key(way);
                Key(Qt::Key_Return);
            });
        return Showing(portfolio);
    }
    KeyboardDay& ToTheList() {
        When("to the list", MainHasKeys, [] {
            for (int steps = 0; steps < 10 && QApplication::focusWidget() != RowsWidget(); ++steps)
                Key(Qt::Key_Tab);
            EXPECT_EQ(QApplication::focusWidget(), RowsWidget());
        });
        return *this;
    }
};

TEST(KeyboardDay, NeedsNoMouse) {
    KeyboardDay day;
    day.AddPortfolioByKeys("Later").AddPortfolioByKeys("Now");
    day.AddByKeys("Birch", "10").Expect({"Birch"});
    day.AddByKeys("Acme", "20").Expect({"Birch", "Acme"});
    day.AddByKeys("Cedar", "5").Expect({"Birch", "Acme", "Cedar"});
    day.Then("risk and retirement", [] {
        EXPECT_STREQ(Program::Row(0)->Text(9), "High");
        EXPECT_STREQ(Program::Row(0)->Text(8), "yes");
        EXPECT_EQ(Program::Total(), "Total Value: $70.00");
    });
    // The list's header comes after the list, and its first column is the name.
    day.ToTheList().Press(Qt::Key_Tab).Press(Qt::Key_Space).Expect({"Acme", "Birch", "Cedar"});
    // Enter edits the row that a typed letter has found; Escape leaves it as it was.
    day.ToTheList().Press(Qt::Key_Home).Press(Qt::Key_C).Press(Qt::Key_Return);
    day.In("Edit this Investment", [] {
        Type("not kept");
        Key(Qt::Key_Escape);
    });
    day.Expect({"Acme", "Birch", "Cedar"}).Press(Qt::Key_Return);
    day.In("Edit this Investment", [] {
        Type("Cypress");
        Key(Qt::Key_Return);
    });
    day.Expect({"Acme", "Birch", "Cypress"}).Then("the row that was edited", [] {
        EXPECT_EQ(Program::RowsWidget()->currentIndex().row(), 2);
    });
    // Two rows go to the other portfolio.
    day.ToTheList().Press(Qt::Key_Home).Press(Qt::Key_Down, Qt::ShiftModifier).Choose(Qt::Key_I, Qt::Key_C);
    day.Expect({"Cypress"})
        .Press(Qt::Key_O, Qt::AltModifier)
        .Switch(Qt::Key_Up, "Later")
        .Expect({})
        .Choose(Qt::Key_I, Qt::Key_P);
    day.Expect({"Acme", "Birch"}).Press(Qt::Key_Down).Switch(Qt::Key_Down, "Now").Expect({"Cypress"});
    // Buttons by their letters: the charts, and back by Escape.
    day.Press(Qt::Key_C, Qt::AltModifier).In("Quorvan", [] {
        QTest::keyClick(QApplication::activeModalWidget(), Qt::Key_Escape);
    });
    day.Choose(Qt::Key_P, Qt::Key_D);
    for (const char* question : {"Are you sure you want to delete this portfolio?", "Are you really sure?"})
        day.When(
            question,
            [question] {
                return Driver::Alert() && Driver::Alert()->text() == question && HasKeys(Driver::Alert());
            },
            [] { QTest::keyClick(Driver::Alert(), Qt::Key_Y, Qt::AltModifier); });
    day.Showing("Later").Expect({"Acme", "Birch"}).Press(Qt::Key_Q, Qt::ControlModifier);
    day.Run();
    EXPECT_EQ(day.Portfolios(), Texts{"Later"});
    EXPECT_EQ(day.Investments(), (Texts{"Later/Acme", "Later/Birch"}));
}

} // namespace
