// The program with letters half as large again: nothing that it shows may be cut off.
#include "Program.h"

#include <cmath>

#include <QAbstractButton>
#include <QLabel>

#include "ColumnListView/CLVColumn.h"
#include "tools/FirstFiles.h"
#include "tools/SampleData.h"
#include "util/IniFile.h"

namespace {

constexpr int FontPoints = 14;
constexpr const char* Retirement = "My Retirement Fund";

// Every text that is shown in the window's labels, buttons and fields has room in them, and they in the
// window.
void ExpectTextsWhole(const QWidget* window) {
    ASSERT_TRUE(window);
    for (const QWidget* widget : window->findChildren<QWidget*>()) {
        const auto* label = qobject_cast<const QLabel*>(widget);
        const auto* button = qobject_cast<const QAbstractButton*>(widget);
        const auto* line = qobject_cast<const QLineEdit*>(widget);
        if (!widget->isVisible() || !(label || button || line))
            continue;
        const QString text = label ? label->text() : button ? button->text() : line->text();
        const QSize needed = widget->fontMetrics().size(Qt::TextShowMnemonic, text);
        const QPoint place = widget->mapTo(window, QPoint(0, 0));
        const std::string what = text.toStdString() + " in " + window->windowTitle().toStdString();
        EXPECT_GE(widget->width(), needed.width()) << what;
        EXPECT_GE(widget->height(), needed.height()) << what;
        EXPECT_LE(place.x() + needed.width(), window->width()) << what;
        EXPECT_LE(place.y() + needed.height(), window->height()) << what;
        EXPECT_FALSE(text.contains(QChar(0x2026))) << what; // the dots of a shortened one
    }
}

void ExpectColumnsWide() {
    const ColumnListView* list = Program::List();
    BFont font;
    list->GetFont(&font);
    EXPECT_GT(font.Size(), 17);
    for (int32 column = 1; column < InvestmentColumnCount; ++column) {
        const float width = list->ColumnAt(column)->Width();
        EXPECT_LT(be_plain_font->StringWidth(list->ColumnAt(column)->GetLabel()) + 8, width) << column;
        for (int32 row = 0; row < list->CountItems(); ++row)
            EXPECT_LT(font.StringWidth(Program::Row(row)->Text(column)) + 2, width)
                << Program::Row(row)->Text(column);
    }
}

TEST(LargeFont, NothingIsCutOff) {
    qAddPreRoutine([] { QApplication::setFont(QFont("DejaVu Sans", FontPoints)); });
    Program program;
    program.Write("Quorvan.ini", std::string(FirstSettings()));
    {
        DATABASE portfolios(program.File("portfol.db").c_str());
        DATABASE investments(program.File("invest.db").c_str());
        ASSERT_TRUE(AppendSamplePortfolios(portfolios) && AppendSampleInvestments(investments));
    }
    const auto openAndLook = [&](uint32 code, const char* title) {
        program.Send(code).When(title, Driver::WindowShown(title), [title] {
            ExpectTextsWhole(Driver::Window(title));
            QTest::keyClick(Driver::Window(title), Qt::Key_Escape);
        });
    };
    program.Then("main window", [] {
        EXPECT_EQ(Program::Selector()->FindMarked()->Label(), std::string(Retirement));
        ExpectTextsWhole(Program::Main());
        ExpectColumnsWide();
        Program::List()->Select(9); // the longest type and many shares
    });
    openAndLook(MessageInvestmentEdit, "Edit this Investment");
    openAndLook(1000, "Settings");
    openAndLook(MessagePortfolioEdit, "Edit Portfolio");
    program.RunAndClose();

    // Saved for this size, the widths are the same at the next start.
    const INI_FILEx settings(program.File("Quorvan.ini").c_str());
    const int saved = settings.ReadInt("DISPLAY", "ColumnWidth1", 0);
    EXPECT_EQ(settings.ReadInt("DISPLAY", "TextSize", 0), 19);
    EXPECT_EQ(saved, std::lround(185 * 19 / 12.0F));
    EXPECT_EQ(settings.ReadInt("DISPLAY", "ColumnWidth0", 0), 20);
    program.Then("again", [saved] { EXPECT_EQ(Program::List()->ColumnAt(1)->Width(), saved); });
    program.RunAndClose();
}

} // namespace
