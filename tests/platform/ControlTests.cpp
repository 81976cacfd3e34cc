// Controls as a person finds them: worked with the mouse and the keys, read by their names.
#include <cmath>
#include <set>

#include <QCheckBox>
#include <QClipboard>
#include <QLabel>
#include <QLineEdit>
#include <QListView>
#include <QProgressBar>
#include <QPushButton>
#include <QScrollBar>
#include <QToolTip>

#include "Stage.h"
#include "Worker.h"
#include "platform/Button.h"
#include "platform/CheckBox.h"
#include "platform/ListView.h"
#include "platform/MenuField.h"
#include "platform/ScrollView.h"
#include "platform/StatusBar.h"
#include "platform/StringView.h"
#include "platform/TextControl.h"

using Controls = StageTest;
using TextControls = StageTest;
using StatusBars = StageTest;

TEST_F(Controls, SendTheirMessagesWhenWorked) {
    auto* ok = Add(new BButton(BRect(10, 10, 90, 39), "ok", "Ok", new BMessage(1)));
    Add(new BButton(BRect(100, 10, 190, 39), "other", "Other", new BMessage(2)));
    auto* box = Add(new BCheckBox(BRect(10, 50, 200, 70), "box", "Box", new BMessage(3)));
    auto* text = Add(new BTextControl(BRect(10, 90, 300, 110), "text", "Text", ""));
    window->SetDefaultButton(ok);
    Show();

    QTest::mouseClick(Find<QPushButton>("ok"), Qt::LeftButton);
    QTest::keyClick(Find<QPushButton>("other"), Qt::Key_Space);
    text->MakeFocus();
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Return);
    Find<QPushButton>("other")->setFocus();
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Enter);
    EXPECT_EQ(Received(4), (Codes{1, 2, 1, 2}));

    QTest::mouseClick(Find<QCheckBox>("box"), Qt::LeftButton, {}, QPoint(8, 10));
    EXPECT_EQ(box->Value(), B_CONTROL_ON);
    box->SetValue(B_CONTROL_OFF); // the program's own change sends nothing
    QTest::keyClick(Find<QCheckBox>("box"), Qt::Key_Space);
    EXPECT_EQ(Received(2), (Codes{3, 3}));
    EXPECT_EQ(box->Value(), B_CONTROL_ON);
}

TEST_F(Controls, HaveNamesLabelsAndLettersOfTheirOwn) {
    Add(new BButton(BRect(10, 10, 90, 39), "save", "Save & go", new BMessage(1)));
    Add(new BButton(BRect(100, 10, 190, 39), "search", "Search", new BMessage(2)));
    Add(new BCheckBox(BRect(10, 50, 200, 70), "sell", "Sell", new BMessage(3)));
    Add(new BTextControl(BRect(10, 90, 300, 110), "shares", "Shares", ""));
    Add(new BButton(BRect(200, 10, 230, 39), "ss", "Ss", new BMessage(4)));
    Add(new BButton(BRect(10, 130, 190, 159), "next", "Sales tax", new BMessage(5)));
    Show();
    const auto* line = Find<QLineEdit>("shares");
    EXPECT_EQ(line->accessibleName(), "Shares");
    EXPECT_EQ(Find<QPushButton>("save")->accessibleName(), "Save & go");
    EXPECT_EQ(Find<QPushButton>("save")->text(), "&Save && go");
    EXPECT_EQ(Find<QPushButton>("search")->text(), "S&earch");
    EXPECT_EQ(Find<QCheckBox>("sell")->text(), "Se&ll");
    EXPECT_EQ(Find<QPushButton>("ss")->text(), "Ss");
    EXPECT_EQ(Find<QPushButton>("next")->text(), "Sales &tax"); // a word's beginning before any other letter
    const auto* label = qobject_cast<QLabel*>(line->parentWidget()->children().first());
    EXPECT_EQ(label->text(), "S&hares");
    QTest::keyClick(Toolkit(), Qt::Key_H, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), line);
}

double Luminance(QRgb color) {
    const auto part = [](int value) { return std::pow(value / 255.0, 2.2); };
    return 0.2126 * part(qRed(color)) + 0.7152 * part(qGreen(color)) + 0.0722 * part(qBlue(color));
}

// The contrast ratio between the lightest and the darkest pixel that a widget shows inside its frame.
double Contrast(const QWidget* widget) {
    constexpr int frame = 4;
    const QPoint place = widget->mapTo(widget->window(), QPoint(0, 0));
    const QImage shown =
        widget->window()->grab(QRect(place, widget->size()).adjusted(frame, frame, -frame, -frame)).toImage();
    std::set<double> found;
    for (int y = 0; y < shown.height(); y++)
        for (int x = 0; x < shown.width(); x++)
            found.insert(Luminance(shown.pixel(x, y)));
    return (*found.rbegin() + 0.05) / (*found.begin() + 0.05);
}

class BlankRow : public BListItem {
  public:
    void DrawItem(BView*, BRect, bool) override {}
};

// Labels, check boxes and arrows bring no background of their own, or only half of one: they must stand out
// from what they are drawn on, be it the view's colour or the theme's.
TEST_F(Controls, AreReadableWhateverTheTheme) {
    auto* ground = Add(new BView(BRect(0, 0, 399, 299), "ground", B_FOLLOW_ALL_SIDES, B_WILL_DRAW));
    ground->AddChild(new BCheckBox(BRect(10, 10, 200, 40), "box", "Box", nullptr));
    ground->AddChild(new BTextControl(BRect(10, 50, 300, 80), "line", "Line", "typed"));
    ground->AddChild(new BButton(BRect(10, 90, 100, 120), "button", "Button", nullptr));
    auto* menu = new BPopUpMenu("");
    menu->AddItem(new BMenuItem("One", nullptr));
    ground->AddChild(new BMenuField(BRect(10, 130, 32, 150), "arrow", "", menu));
    ground->AddChild(new BStatusBar(BRect(10, 160, 300, 200), "bar", "Working"));
    auto* total = new BStringView(BRect(10, 210, 200, 240), "total", "Total");
    ground->AddChild(total);
    BlankRow rows[30];
    auto* list = new BListView(BRect(310, 10, 370, 60), "list");
    for (BlankRow& row : rows)
        list->AddItem(&row);
    ground->AddChild(new BScrollView("around", list, B_FOLLOW_NONE, 0, false, true, B_NO_BORDER));
    Show();
    Find<QListView>("list")->verticalScrollBar()->setObjectName("scroll bar");
    QPalette dark(QColor(49, 54, 59), QColor(49, 54, 59));
    dark.setColor(QPalette::Base, QColor(35, 38, 41));
    for (const QPalette::ColorRole role : {QPalette::WindowText, QPalette::Text, QPalette::ButtonText})
        dark.setColor(role, QColor(239, 240, 241));
    for (const QPalette& palette : {QPalette(QColor(239, 239, 239)), dark}) {
        QApplication::setPalette(palette);
        ASSERT_TRUE(QTest::qWaitFor([&] {
            return Find<QWidget>("line")->palette().color(QPalette::Base) == palette.color(QPalette::Base);
        }));
        for (const rgb_color color : {rgb_color{216, 216, 216, 255}, rgb_color{30, 30, 30, 255}}) {
            ground->SetViewColor(color);
            for (const char* name :
                 {"box", "line", "line container", "button", "arrow", "bar text", "scroll bar"})
                EXPECT_GT(Contrast(Find<QWidget>(name)), 4.5)
                    << name << " on " << int{color.red} << " with a window of "
                    << palette.color(QPalette::Window).lightness();
        }
        total->SetHighColor(0, 128, 0);
        EXPECT_EQ(Find<QLabel>("total")->palette().color(QPalette::WindowText), QColor(0, 128, 0));
    }
}

TEST_F(TextControls, AreLaidOutByTheirDividerAndHeardOfAtTheirEnd) {
    auto* text = Add(new BTextControl(BRect(10, 90, 309, 92), "text", "Text", ""));
    EXPECT_EQ(Find<QLineEdit>("text")->geometry().left(), 149);
    text->SetDivider(80);
    text->ResizeTo(319, text->Frame().Height());
    Show();
    const QRect line = Find<QLineEdit>("text")->geometry();
    EXPECT_EQ(line.left(), 80);
    EXPECT_EQ(line.width(), 240);
    EXPECT_GE(line.height(), QFontMetrics(QApplication::font()).height());
    EXPECT_EQ(text->Frame().Height() + 1, static_cast<float>(line.height()));
    // The toolkit's own record of what assistive technology was told would keep a line that goes unheard.
    bool heard = false;
    QObject::connect(Find<QLineEdit>("text"), &QObject::destroyed, [&] { heard = true; });
    ASSERT_TRUE(text->RemoveSelf());
    delete text;
    EXPECT_TRUE(heard);
}

TEST_F(TextControls, KeepToTheirBytesWhateverIsPutIn) {
    const struct {
        const char* name;
        const char* before;
        int cursor;
        int selected; // characters from the cursor on that are replaced
        const char* pasted;
        const char* after;
        int cursorAfter;
        int32 limit; // in bytes
    } cases[] = {
        {"all of it fits", "abcd", 4, 0, "efgh", "abcdefgh", 8, 8},
        {"what does not fit is not taken in part", "abcd", 1, 0, "xyz", "abcd", 1, 6},
        {"a replaced part makes room", "abcd", 1, 2, "xy", "axyd", 3, 4},
        {"no room at all", "abcd", 2, 0, "x", "abcd", 2, 4},
        {"two-byte letters are kept whole", "abcd", 4, 0, "\xC3\xA9", "abcd", 4, 5},
        {"line ends and tabs become blanks", "a", 1, 0, "b\nc\td\r", "ab c d", 6, 6},
    };
    auto* text = Add(new BTextControl(BRect(10, 90, 300, 110), "text", "Text", ""));
    Show();
    auto* line = Find<QLineEdit>("text");
    for (const auto& each : cases) {
        SCOPED_TRACE(each.name);
        text->SetMaxBytes(each.limit);
        text->SetText(each.before);
        line->setCursorPosition(each.cursor);
        line->setSelection(each.cursor, each.selected);
        QApplication::clipboard()->setText(QString::fromUtf8(each.pasted));
        line->paste();
        EXPECT_STREQ(text->Text(), each.after);
        EXPECT_EQ(line->cursorPosition(), each.cursorAfter);
    }
    text->SetMaxBytes(3);
    EXPECT_STREQ(text->Text(), "ab ");
    text->SetText("x\xC3\xA9\xC3\xA9");
    EXPECT_STREQ(text->Text(), "x\xC3\xA9");
    // A letter that is refused leaves the text as it was, with what can be undone.
    text->SetText("old");
    text->MakeFocus();
    EXPECT_TRUE(text->IsFocus());
    QTest::keyClicks(line, "abcd"); // over the old text, which the focus selects
    EXPECT_STREQ(text->Text(), "abc");
    EXPECT_TRUE(QToolTip::text().contains("At most 3 characters fit here"));
    line->undo();
    EXPECT_STREQ(text->Text(), "old");
}

TEST_F(StatusBars, ShowWhatAWorkerTellsThem) {
    auto* bar = Add(new BStatusBar(BRect(10, 10, 190, 50), "bar", "Checking:"));
    bar->SetMaxValue(4);
    Show();
    const Worker worker([&] {
        for (int step = 0; step < 3; step++) {
            window->Lock();
            bar->Update(1);
            bar->SetText((" T" + std::to_string(step)).c_str());
            window->Unlock();
        }
    });
    const auto* widget = Find<QProgressBar>("bar");
    EXPECT_TRUE(QTest::qWaitFor([&] { return widget->accessibleName() == "Checking: T2"; }));
    EXPECT_EQ(Find<QLabel>("bar text")->text(), "Checking: T2");
    EXPECT_EQ(widget->value() * 4, widget->maximum() * 3);
    bar->Update(100);
    EXPECT_TRUE(QTest::qWaitFor([&] { return widget->value() == widget->maximum(); }));
}
