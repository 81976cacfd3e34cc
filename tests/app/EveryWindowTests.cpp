// Every window of the program, with the sample portfolios in it: all is said to who does not see it, and
// nothing is cut off for who wants large letters.
#include "Program.h"

#include <cmath>

#include <QAccessible>
#include <QLabel>

#include "ColumnListView/CLVColumn.h"
#include "tools/FirstFiles.h"
#include "tools/SampleData.h"
#include "util/IniFile.h"

namespace {

using Role = QAccessible::Role;

class EveryWindow : public testing::Test, protected Program {
  protected:
    EveryWindow() {
        Write("Quorvan.ini", std::string(FirstSettings()));
        DATABASE portfolios(File("portfol.db").c_str());
        DATABASE investments(File("invest.db").c_str());
        EXPECT_TRUE(AppendSamplePortfolios(portfolios) && AppendSampleInvestments(investments));
    }
    // Steps that choose an item by the mouse, look at the dialog or alert that it opens, and leave it.
    void LookAt(const char* menu, const char* item, const char* text, std::function<void(QWidget*)> look) {
        Then(item, [menu, item] {
            ClickTitle(Main(), menu);
            ClickItem(item);
        });
        const auto shown = [text] {
            const QWidget* dialog = QApplication::activeModalWidget();
            return dialog && (Alert() ? Alert()->text() : dialog->windowTitle()) == text;
        };
        When(text, shown, [look = std::move(look)] {
            look(QApplication::activeModalWidget());
            QTest::keyClick(QApplication::activeModalWidget(), Qt::Key_Escape);
        });
    }
};

// The first element at or below `top` with this role, and this name if one is given; null when there is none.
QAccessibleInterface* FindElement(QAccessibleInterface* top, Role role, const char* name = nullptr) {
    if (top->role() == role && (!name || top->text(QAccessible::Name) == name))
        return top;
    for (int i = 0; i < top->childCount(); ++i)
        if (auto* found = FindElement(top->child(i), role, name))
            return found;
    return nullptr;
}

std::string Description(QAccessibleInterface* element) {
    return element ? element->text(QAccessible::Description).toStdString() : "none";
}

// Everything that a person can do something with, or that says something, has a name. The rest holds things
// together.
void ExpectNamed(QAccessibleInterface* element, const std::string& where = "") {
    constexpr Role silent[] = {Role::Client, Role::Separator, Role::Grouping, Role::Pane, Role::ScrollBar};
    const QString name = element->text(QAccessible::Name);
    const std::string here =
        where + " > " + std::to_string(element->role()) + " '" + name.toStdString() + "'";
    EXPECT_NE(element->role(), Role::NoRole) << here;
    EXPECT_TRUE(!name.isEmpty() || std::ranges::find(silent, element->role()) != std::end(silent)) << here;
    for (int i = 0; i < element->childCount(); ++i)
        ExpectNamed(element->child(i), here);
}

TEST_F(EveryWindow, SaysWhatItIs) {
    Then("main window", [] {
        Main()->grab(); // a description comes with the first painting
        QAccessibleInterface* window = QAccessible::queryAccessibleInterface(Main());
        ExpectNamed(window);
        EXPECT_EQ(window->role(), Role::Window);
        EXPECT_TRUE(FindElement(window, Role::StaticText, "Total Value: $166,851.94"));
        EXPECT_EQ(Description(FindElement(window, Role::ButtonMenu, "Portfolio:")), "My Retirement Fund");
        QAccessibleInterface* list = FindElement(window, Role::List, "Investments");
        ASSERT_TRUE(list && list->childCount() == 16);
        EXPECT_EQ(
            list->child(1)->text(QAccessible::Name).toStdString(),
            "Birch & Sons, BRCH, Stock, 45.500, 88 1/2, 4026.75, 03-03-2025, yes, Med, Broker, price down");
        EXPECT_EQ(Description(FindElement(window, Role::Graphic, "column labels")),
                  "Columns: Name, Ticker, Type, Shares, Price, Value, Date, Retire, Risk, Agent");
        ClickRow(0);
    });
    const struct {
        const char *menu, *item;
        const char* text; // of the window
        Role role;
        const char* name;             // of something that it holds
        std::string description = ""; // its beginning
    } windows[] = {
        {"File", "Settings", "Settings", Role::EditableText, "Password:", "At most 15 characters"},
        {"Portfolio", "Add", "Add a Portfolio", Role::EditableText, "Name:", "At most 31 characters"},
        {"Portfolio", "Edit", "Edit Portfolio", Role::EditableText, "Name:", "At most 31 characters"},
        {"Portfolio", "Del", "Are you sure you want to delete this portfolio?", Role::Graphic, "Warning"},
        {"Portfolio", "Chart", "Quorvan", Role::Graphic, nullptr,
         "Value by Investment\nAlder Paper Mills: $1485.00 0.89%\n"},
        {"Investment", "Add", "Add an Investment", Role::ButtonMenu, "Type choices"},
        {"Investment", "Edit", "Edit this Investment", Role::CheckBox, "Retirement"},
        {"Help", "About Quorvan...",
         "Quorvan version 1.0\n\nThe manual is the file help/Quorvan.html in your Quorvan folder. Help opens "
         "it "
         "in your web browser.",
         Role::Graphic, "Information"}};
    for (const auto& each : windows)
        LookAt(each.menu, each.item, each.text, [&each](QWidget* widget) {
            widget->grab();
            QAccessibleInterface* window = QAccessible::queryAccessibleInterface(widget);
            ExpectNamed(window);
            EXPECT_EQ(window->role(), Alert() ? Role::AlertMessage : Role::Dialog) << each.text;
            QAccessibleInterface* held = FindElement(window, each.role, each.name);
            ASSERT_TRUE(held) << each.text;
            EXPECT_TRUE(Description(held).starts_with(each.description)) << Description(held);
        });
    RunAndClose();
}

// Every text that is shown in the window's labels, buttons and fields has room in them, and they in the
// window.
void ExpectTextsWhole(const QWidget* window) {
    for (const QWidget* widget : window->findChildren<QWidget*>()) {
        const auto* label = qobject_cast<const QLabel*>(widget);
        const auto* button = qobject_cast<const QAbstractButton*>(widget);
        const auto* line = qobject_cast<const QLineEdit*>(widget);
        if (!widget->isVisible() || !(label || button || line))
            continue;
        const QString text = label ? label->text() : button ? button->text() : line->text();
        const QSize needed = widget->fontMetrics().size(Qt::TextShowMnemonic, text);
        const QRect place(widget->mapTo(window, QPoint(0, 0)), needed);
        const std::string what = text.toStdString() + " in " + window->windowTitle().toStdString();
        EXPECT_EQ(widget->size().expandedTo(needed), widget->size()) << what;
        EXPECT_TRUE(window->rect().adjusted(0, 0, 1, 1).contains(place)) << what;
        EXPECT_FALSE(text.contains(QChar(0x2026))) << what; // the dots of a shortened one
    }
}

TEST_F(EveryWindow, HasRoomForLargeLetters) {
    qAddPreRoutine([] { QApplication::setFont(QFont("DejaVu Sans", 14)); });
    Then("main window", [] {
        ExpectTextsWhole(Main());
        BFont font;
        List()->GetFont(&font);
        EXPECT_GT(font.Size(), 17);
        for (int32 column = 1; column < InvestmentColumnCount; ++column) {
            const CLVColumn* shown = List()->ColumnAt(column);
            EXPECT_LT(be_plain_font->StringWidth(shown->GetLabel()) + 8, shown->Width()) << column;
            for (int32 row = 0; row < List()->CountItems(); ++row)
                EXPECT_LT(font.StringWidth(Row(row)->Text(column)) + 2, shown->Width())
                    << Row(row)->Text(column);
        }
        List()->Select(9); // the longest type and many shares
    });
    LookAt("Investment", "Edit", "Edit this Investment", ExpectTextsWhole);
    LookAt("File", "Settings", "Settings", ExpectTextsWhole);
    LookAt("Portfolio", "Edit", "Edit Portfolio", ExpectTextsWhole);
    RunAndClose();

    // Saved for this size, the widths are the same at the next start.
    const INI_FILEx settings(File("Quorvan.ini").c_str());
    const int saved = settings.ReadInt("DISPLAY", "ColumnWidth1", 0);
    EXPECT_EQ(settings.ReadInt("DISPLAY", "TextSize", 0), 19);
    EXPECT_EQ(saved, std::lround(185 * 19 / 12.0F));
    EXPECT_EQ(settings.ReadInt("DISPLAY", "ColumnWidth0", 0), 20);
    Then("again", [saved] { EXPECT_EQ(List()->ColumnAt(1)->Width(), saved); });
    RunAndClose();
}

} // namespace
