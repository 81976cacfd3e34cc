// Controls as a person finds them: worked with the mouse and the keys, read by their names.
#include <algorithm>
#include <cmath>

#include <QCheckBox>
#include <QClipboard>
#include <QLabel>
#include <QLineEdit>
#include <QListView>
#include <QProgressBar>
#include <QPushButton>
#include <QScrollBar>

#include "Stage.h"
#include "platform/Button.h"
#include "platform/CheckBox.h"
#include "platform/Kernel.h"
#include "platform/ListView.h"
#include "platform/MenuField.h"
#include "platform/ScrollView.h"
#include "platform/StatusBar.h"
#include "platform/StringView.h"
#include "platform/TextControl.h"

using Codes = std::vector<uint32>;

TEST(Controls, SendTheirMessagesWhenWorked) {
    Stage stage;
    auto* ok = stage.Add(new BButton(BRect(10, 10, 90, 39), "ok", "Ok", new BMessage(1)));
    stage.Add(new BButton(BRect(100, 10, 190, 39), "other", "Other", new BMessage(2)));
    auto* box = stage.Add(new BCheckBox(BRect(10, 50, 200, 70), "box", "Box", new BMessage(3)));
    auto* off = stage.Add(new BButton(BRect(200, 10, 290, 39), "off", "Off", new BMessage(4)));
    auto* text = stage.Add(new BTextControl(BRect(10, 90, 300, 110), "text", "Text", "", nullptr));
    off->SetEnabled(false);
    stage.window->SetDefaultButton(ok);
    stage.Show();
    EXPECT_TRUE(ok->IsDefault());

    QTest::mouseClick(stage.Find<QPushButton>("ok"), Qt::LeftButton);
    QTest::keyClick(stage.Find<QPushButton>("other"), Qt::Key_Space);
    QTest::mouseClick(stage.Find<QPushButton>("off"), Qt::LeftButton);
    text->MakeFocus();
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Return);
    stage.Find<QPushButton>("other")->setFocus();
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Enter);
    EXPECT_EQ(stage.Received(4), (Codes{1, 2, 1, 2}));

    QTest::mouseClick(stage.Find<QCheckBox>("box"), Qt::LeftButton, {}, QPoint(8, 10));
    EXPECT_EQ(box->Value(), B_CONTROL_ON);
    box->SetValue(B_CONTROL_OFF); // the program's own change sends nothing
    QTest::keyClick(stage.Find<QCheckBox>("box"), Qt::Key_Space);
    EXPECT_EQ(stage.Received(2), (Codes{3, 3}));
    EXPECT_EQ(box->Value(), B_CONTROL_ON);
}

TEST(Controls, InvokerTargetsOutliveNothing) {
    Stage stage;
    BInvoker nobody(new BMessage(7), nullptr);
    EXPECT_EQ(nobody.Invoke(), B_BAD_VALUE);
    BInvoker invoker(new BMessage(7), stage.window);
    const BMessage other(8);
    EXPECT_EQ(invoker.Invoke(), B_OK);
    EXPECT_EQ(invoker.Invoke(const_cast<BMessage*>(&other)), B_OK);
    const BView loose(BRect(0, 0, 9, 9), "loose", B_FOLLOW_NONE, 0);
    EXPECT_EQ(invoker.SetTarget(&loose), B_BAD_VALUE);
    EXPECT_EQ(invoker.Invoke(), B_BAD_VALUE);
    EXPECT_EQ(invoker.SetTarget(nullptr), B_OK);
    stage.Show();
    EXPECT_EQ(stage.Received(2), (Codes{7, 8}));
}

TEST(Controls, HaveNamesLabelsAndLettersOfTheirOwn) {
    Stage stage;
    auto* save = stage.Add(new BButton(BRect(10, 10, 90, 39), "save", "Save & go", new BMessage(1)));
    stage.Add(new BButton(BRect(100, 10, 190, 39), "search", "Search", new BMessage(2)));
    stage.Add(new BCheckBox(BRect(10, 50, 200, 70), "sell", "Sell", new BMessage(3)));
    stage.Add(new BTextControl(BRect(10, 90, 300, 110), "shares", "Shares", "", nullptr));
    stage.Add(new BButton(BRect(200, 10, 230, 39), "ss", "Ss", new BMessage(4)));
    stage.Show();
    const auto* line = stage.Find<QLineEdit>("shares");
    EXPECT_EQ(line->accessibleName(), "Shares");
    EXPECT_EQ(stage.Find<QPushButton>("save")->accessibleName(), "Save & go");
    EXPECT_EQ(stage.Find<QPushButton>("save")->text(), "&Save && go");
    EXPECT_EQ(stage.Find<QPushButton>("search")->text(), "S&earch");
    EXPECT_EQ(stage.Find<QCheckBox>("sell")->text(), "Se&ll");
    EXPECT_EQ(stage.Find<QPushButton>("ss")->text(), "Ss");
    const auto* label = qobject_cast<QLabel*>(line->parentWidget()->children().first());
    EXPECT_EQ(label->text(), "S&hares");
    QTest::keyClick(stage.Toolkit(), Qt::Key_H, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), line);
    save->SetLabel("Keep");
    EXPECT_EQ(stage.Find<QPushButton>("save")->text(), "&Keep");
    EXPECT_EQ(stage.Find<QPushButton>("search")->text(), "&Search");
}

double Luminance(QRgb color) {
    const auto part = [](int value) { return std::pow(value / 255.0, 2.2); };
    return 0.2126 * part(qRed(color)) + 0.7152 * part(qGreen(color)) + 0.0722 * part(qBlue(color));
}

// The contrast ratio between the lightest and the darkest pixel that a widget shows inside its frame.
double Contrast(const QWidget* widget) {
    constexpr int frame = 4;
    const QPoint place = widget->mapTo(widget->window(), QPoint(0, 0));
    const QImage shown = widget->window()
                             ->grab(QRect(place, widget->size()).adjusted(frame, frame, -frame, -frame))
                             .toImage()
                             .convertToFormat(QImage::Format_RGB32);
    double lightest = 0;
    double darkest = 1;
    for (int y = 0; y < shown.height(); y++)
        for (int x = 0; x < shown.width(); x++) {
            lightest = std::max(lightest, Luminance(shown.pixel(x, y)));
            darkest = std::min(darkest, Luminance(shown.pixel(x, y)));
        }
    return (lightest + 0.05) / (darkest + 0.05);
}

class BlankRow : public BListItem {
  public:
    void DrawItem(BView*, BRect, bool) override {}
};

// Labels, check boxes and arrows bring no background of their own, or only half of one: they must stand out
// from what they are drawn on, be it the view's colour or the theme's.
TEST(Controls, AreReadableWhateverTheTheme) {
    Stage stage;
    auto* ground = stage.Add(new BView(BRect(0, 0, 399, 299), "ground", B_FOLLOW_ALL_SIDES, B_WILL_DRAW));
    ground->AddChild(new BCheckBox(BRect(10, 10, 200, 40), "box", "Box", nullptr));
    ground->AddChild(new BTextControl(BRect(10, 50, 300, 80), "line", "Line", "typed", nullptr));
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
    stage.Show();
    stage.Find<QListView>("list")->verticalScrollBar()->setObjectName("scroll bar");
    QPalette dark(QColor(49, 54, 59), QColor(49, 54, 59));
    dark.setColor(QPalette::Base, QColor(35, 38, 41));
    for (const QPalette::ColorRole role : {QPalette::WindowText, QPalette::Text, QPalette::ButtonText})
        dark.setColor(role, QColor(239, 240, 241));
    for (const QPalette& palette : {QPalette(QColor(239, 239, 239)), dark}) {
        QApplication::setPalette(palette);
        ASSERT_TRUE(QTest::qWaitFor([&] {
            return stage.Find<QWidget>("line")->palette().color(QPalette::Base) ==
                   palette.color(QPalette::Base);
        }));
        for (const rgb_color color : {rgb_color{216, 216, 216, 255}, rgb_color{30, 30, 30, 255}}) {
            ground->SetViewColor(color);
            for (const char* name :
                 {"box", "line", "line container", "button", "arrow", "bar text", "scroll bar"})
                EXPECT_GT(Contrast(stage.Find<QWidget>(name)), 4.5)
                    << name << " on " << int{color.red} << " with a window of "
                    << palette.color(QPalette::Window).lightness();
        }
        total->SetHighColor(0, 128, 0);
        EXPECT_EQ(stage.Find<QLabel>("total")->palette().color(QPalette::WindowText), QColor(0, 128, 0));
    }
}

TEST(TextControls, AreLaidOutByTheirDividerAtTheHeightTheyNeed) {
    Stage stage;
    auto* text = stage.Add(new BTextControl(BRect(10, 90, 309, 92), "text", "Text", "", nullptr));
    EXPECT_EQ(text->Divider(), 149);
    text->SetDivider(80);
    text->ResizeBy(20, 0);
    stage.Show();
    const QRect line = stage.Find<QLineEdit>("text")->geometry();
    EXPECT_EQ(line.left(), 80);
    EXPECT_EQ(line.width(), 240);
    EXPECT_GE(line.height(), QFontMetrics(QApplication::font()).height());
    EXPECT_EQ(text->Frame().Height() + 1, static_cast<float>(line.height()));
}

namespace {

struct Entry {
    const char* name;
    int32 limit;
    const char* before;
    int cursor;
    int selected; // characters from the cursor on that are replaced
    const char* pasted;
    const char* after;
    int cursorAfter;
};

constexpr Entry kEntries[] = {
    {"all of it fits", 8, "abcd", 4, 0, "efgh", "abcdefgh", 8},
    {"the end of what is put in is cut", 6, "abcd", 4, 0, "xyz", "abcdxy", 6},
    {"what was there stays", 6, "abcd", 1, 0, "xyz", "axybcd", 3},
    {"equal letters around the cursor", 5, "aaaa", 0, 0, "aaa", "aaaaa", 1},
    {"a replaced part makes room", 4, "abcd", 1, 2, "xyz", "axyd", 3},
    {"no room at all", 4, "abcd", 2, 0, "x", "abcd", 2},
    {"two-byte letters are kept whole", 5, "abcd", 4, 0, "\xC3\xA9", "abcd", 4},
    {"four-byte letters are kept whole", 8, "abc", 3, 0, "\xF0\x9F\x98\x80\xF0\x9F\x98\x80",
     "abc\xF0\x9F\x98\x80", 5},
    {"an accent stays with its letter", 6, "abcd", 4, 0, "xe\xCC\x81", "abcdx", 5},
    {"line ends and tabs become blanks", 31, "a", 1, 0, "b\nc\td\r", "ab c d ", 7},
};

} // namespace

TEST(TextControls, KeepToTheirBytesWhateverIsPutIn) {
    Stage stage;
    auto* text = stage.Add(new BTextControl(BRect(10, 90, 300, 110), "text", "Text", "", nullptr));
    stage.Show();
    auto* line = stage.Find<QLineEdit>("text");
    for (const Entry& entry : kEntries) {
        SCOPED_TRACE(entry.name);
        text->SetMaxBytes(entry.limit);
        text->SetText(entry.before);
        line->setCursorPosition(entry.cursor);
        line->setSelection(entry.cursor, entry.selected);
        QApplication::clipboard()->setText(QString::fromUtf8(entry.pasted));
        line->paste();
        EXPECT_STREQ(text->Text(), entry.after);
        EXPECT_EQ(line->cursorPosition(), entry.cursorAfter);
    }
    text->SetMaxBytes(3);
    EXPECT_STREQ(text->Text(), "ab ");
    text->SetText("x\xC3\xA9\xC3\xA9");
    EXPECT_STREQ(text->Text(), "x\xC3\xA9");
    // A letter that is refused leaves the text as it was, with what can be undone.
    text->SetText("");
    text->MakeFocus();
    QTest::keyClicks(line, "abcd");
    EXPECT_STREQ(text->Text(), "abc");
    line->undo();
    EXPECT_STREQ(text->Text(), "");
}

TEST(TextControls, SendOnEnterAndOnLeavingAChangedText) {
    Stage stage;
    auto* text = stage.Add(new BTextControl(BRect(10, 90, 300, 110), "text", "Text", "old", new BMessage(1)));
    auto* other = stage.Add(new BTextControl(BRect(10, 130, 300, 150), "other", "Other", "", nullptr));
    text->MakeFocus();
    stage.Show();
    EXPECT_TRUE(text->IsFocus());
    QTest::keyClicks(QApplication::focusWidget(), "new"); // over the old one, which was selected
    EXPECT_STREQ(text->Text(), "new");
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    EXPECT_TRUE(other->IsFocus());
    EXPECT_EQ(stage.Received(1), Codes{1});
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Backtab);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Return);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab); // nothing changed since
    EXPECT_EQ(stage.Received(1), Codes{1});
}

// The toolkit's own record of what assistive technology was told would keep a line that has gone.
TEST(TextControls, LetOthersHearOfTheirEnd) {
    Stage stage;
    auto* text = stage.Add(new BTextControl(BRect(10, 90, 309, 92), "text", "Text", "", nullptr));
    stage.Show();
    bool heard = false;
    QObject::connect(stage.Find<QLineEdit>("text"), &QObject::destroyed, [&] { heard = true; });
    ASSERT_TRUE(stage.window->RemoveChild(text));
    delete text;
    EXPECT_TRUE(heard);
}

TEST(StatusBars, ShowWhatAWorkerTellsThem) {
    Stage stage;
    auto* bar = stage.Add(new BStatusBar(BRect(10, 10, 190, 50), "bar", "Checking:", " %"));
    bar->SetMaxValue(4);
    stage.Show();
    struct Shared {
        RecordingWindow* window;
        BStatusBar* bar;
    } shared{stage.window, bar};
    const thread_id worker = spawn_thread(
        [](void* data) -> int32 {
            const auto* both = static_cast<Shared*>(data);
            for (int step = 0; step < 3; step++) {
                both->window->Lock();
                both->bar->Update(1);
                both->bar->SetText((" T" + std::to_string(step)).c_str());
                both->window->Unlock();
            }
            return 0;
        },
        "worker", B_NORMAL_PRIORITY, &shared);
    resume_thread(worker);
    const auto* widget = stage.Find<QProgressBar>("bar");
    EXPECT_TRUE(QTest::qWaitFor([&] { return widget->accessibleName() == "Checking: T2"; }));
    EXPECT_EQ(stage.Find<QLabel>("bar text")->text(), "Checking: T2");
    EXPECT_EQ(widget->value() * 4, widget->maximum() * 3);
    EXPECT_EQ(bar->CurrentValue(), 3);
    bar->Update(100, nullptr, "100");
    EXPECT_EQ(bar->CurrentValue(), 4);
    EXPECT_EQ(bar->Text(), " T2");
    EXPECT_TRUE(QTest::qWaitFor([&] { return widget->value() == widget->maximum(); }));
}
