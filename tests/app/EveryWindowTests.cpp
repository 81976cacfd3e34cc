// Every window of the program, with letters half as large again: all is said to who does not see it, and
// nothing is cut off.
#include "Program.h"

#include <cmath>

#include <QAccessible>

#include "ColumnListView/CLVColumn.h"
#include "tools/FirstFiles.h"

namespace {

using Role = QAccessible::Role;

// The first element at or below `top` with this role, and this name if one is given; null when there is none.
QAccessibleInterface* FindElement(QAccessibleInterface* top, Role role, const char* name = nullptr) {
    if (top->role() == role && (!name || top->text(QAccessible::Name) == name))
        return top;
    for (int i = 0; i < top->childCount(); ++i)
        if (auto* found = FindElement(top->child(i), role, name))
            return found;
    return nullptr;
}

// Everything that a person can do something with, or that says something, has a name. The rest holds things
// together.
void ExpectNamed(QAccessibleInterface* element, const std::string& where = "") {
    constexpr Role silent[] = {Role::Client, Role::Separator, Role::Grouping, Role::Pane, Role::ScrollBar};
    const std::string name = element->text(QAccessible::Name).toStdString();
    const std::string here = where + " > " + std::to_string(element->role()) + " '" + name + "'";
    EXPECT_NE(element->role(), Role::NoRole) << here;
    EXPECT_TRUE(!name.empty() || std::ranges::count(silent, element->role()) != 0) << here;
    for (int i = 0; i < element->childCount(); ++i)
        ExpectNamed(element->child(i), here);
}

// Every text that is shown in the window's labels, buttons and fields has room in them, and they in the
// window.
void ExpectTextsWhole(const QWidget* window) {
    for (const QWidget* widget : window->findChildren<QWidget*>()) {
        const QString text = widget->property("text").toString();
        if (!widget->isVisible() || text.isEmpty() || widget->property("wordWrap").toBool())
            continue;
        const QSize needed = widget->fontMetrics().size(Qt::TextShowMnemonic, text);
        const QRect place(widget->mapTo(window, QPoint(0, 0)), needed);
        const std::string what = text.toStdString() + " in " + window->windowTitle().toStdString();
        EXPECT_EQ(widget->size().expandedTo(needed), widget->size()) << what;
        EXPECT_EQ(window->rect().united(place), window->rect()) << what;
        EXPECT_FALSE(text.contains(QChar(0x2026))) << what; // the dots of a shortened one
    }
}

void ExpectWindow(QWidget* window, Role windowRole, Role role, const char* name, const char* description) {
    window->grab(); // a description comes with the first painting
    ExpectTextsWhole(window);
    QAccessibleInterface* element = QAccessible::queryAccessibleInterface(window);
    ExpectNamed(element);
    EXPECT_EQ(element->role(), windowRole);
    QAccessibleInterface* held = FindElement(element, role, name);
    ASSERT_TRUE(held) << description;
    EXPECT_TRUE(held->text(QAccessible::Description).toStdString().starts_with(description)) << description;
}

// They were chosen for letters of 12 pixels; saved for others, they are the same at the next start.
void ExpectWidths(const char* when) {
    EXPECT_EQ(Program::List()->ColumnAt(0)->Width(), 20) << when;
    EXPECT_EQ(Program::List()->ColumnAt(1)->Width(), std::round(185 * 19 / 12.0F)) << when;
}

void ExpectList(QAccessibleInterface* list) {
    ASSERT_TRUE(list && list->childCount() == 16);
    EXPECT_EQ(list->child(1)->text(QAccessible::Name).toStdString(),
              "Birch & Sons, Ticker BRCH, Type Stock, Shares 45.500, Price 88 1/2, Value 4026.75, "
              "Date 03-03-2025, Retire yes, Risk Med, Agent Broker, price down");
    BFont font;
    Program::List()->GetFont(&font);
    EXPECT_GT(font.Size(), 17);
    for (int32 i = 1; i < InvestmentColumnCount; ++i) {
        const CLVColumn* column = Program::List()->ColumnAt(i);
        EXPECT_LT(be_plain_font->StringWidth(column->GetLabel()) + 8, column->Width()) << i;
        for (int32 row = 0; row < 16; ++row)
            EXPECT_LT(font.StringWidth(Program::Row(row)->Text(i)) + 2, column->Width())
                << i << " of " << row;
    }
}

TEST(EveryWindow, SaysWhatItIsAndHasRoomForLargeLetters) {
    qAddPreRoutine([] { QApplication::setFont(QFont("DejaVu Sans", 14)); });
    Program program;
    program.Write("Quorvan.ini", std::string(FirstSettings()));
    DATABASE portfolios(program.File("portfol.db").c_str());
    DATABASE investments(program.File("invest.db").c_str());
    ASSERT_TRUE(AppendSamplePortfolios(portfolios) && AppendSampleInvestments(investments));
    program.Then([] {
        QWidget* main = Program::Main();
        ExpectWindow(main, Role::Window, Role::ButtonMenu, "Portfolio:", "My Retirement Fund");
        ExpectWindow(main, Role::Window, Role::StaticText, "Total Value: $166,851.94", "");
        ExpectWindow(main, Role::Window, Role::Grouping, "column labels",
                     "Columns: Name, Ticker, Type, Shares, Price, Value, Date, Retire, Risk, Agent");
        ExpectWidths("first");
        ExpectList(FindElement(QAccessible::queryAccessibleInterface(main), Role::List, "Investments"));
        Program::ClickRow(9); // the longest type and many shares
    });
    static constexpr struct {
        const char *menu, *item;
        const char* text; // of the window
        Role role;
        const char* name; // of something that it holds
        const char* description = "";
    } windows[] = {
        {"File", "Settings", "Settings", Role::EditableText, "Password:", "At most 15 characters"},
        {"Portfolio", "Add", "Add a Portfolio", Role::EditableText, "Name:", "At most 31 characters"},
        {"Portfolio", "Edit", "Edit Portfolio", Role::EditableText, "Name:", "At most 31 characters"},
        {"Portfolio", "Del", "Are you sure you want to delete this portfolio?", Role::Graphic, "Warning"},
        {"Portfolio", "Chart", "Quorvan", Role::Graphic, "Chart of My Retirement Fund",
         "Value by Investment\nAlder Paper Mills: $1485"},
        {"Investment", "Add", "Add an Investment", Role::ButtonMenu, "Type choices"},
        {"Investment", "Edit", "Edit this Investment", Role::CheckBox, "Retirement"},
        {"Help", "About Quorvan...", NorvelApp::AboutText, Role::Graphic, "Information"}};
    for (const auto& each : windows) {
        program.Then([&each] {
            Driver::ClickTitle(Program::Main(), each.menu);
            Driver::ClickItem(each.item);
        });
        program.When(QApplication::activeModalWidget, [&each] {
            QWidget* shown = QApplication::activeModalWidget();
            const bool alert = Driver::Alert() != nullptr;
            EXPECT_EQ(alert ? Driver::Alert()->text() : shown->windowTitle(), each.text);
            ExpectWindow(shown, alert ? Role::AlertMessage : Role::Dialog, each.role, each.name,
                         each.description);
            QTest::keyClick(shown, Qt::Key_Escape);
        });
    }
    program.RunAndClose();
    program.Then([] { ExpectWidths("again"); });
    program.RunAndClose();
}

} // namespace
