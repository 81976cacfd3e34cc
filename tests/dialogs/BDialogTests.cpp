// The modal dialog base, worked with real events while its caller waits.
#include "Driver.h"
#include "Worker.h"

#include <QPushButton>
#include <QScreen>

#include "dialogs/BDialog.h"
#include "platform/Button.h"
#include "platform/Stage.h"
#include "platform/TextControl.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr uint32 MessageOwn = 3000;

// Counts what it is told, refuses Ok as often as it should, and has a field and a button of its own.
class TestDialog : public BDialog {
  public:
    explicit TestDialog(uint16 flags = 3, BRect frame = {50, 50, 350, 200}, const char* title = "Test")
        : BDialog(frame, title, flags) {
        auto* field = new BTextControl({10, 10, 290, 30}, "field", "Field:", "text");
        Form()->AddChild(field);
        Form()->AddChild(new BButton({110, 50, 190, 70}, "own", "Own", new BMessage(MessageOwn)));
        if (frame.Height() > 1000)
            Form()->AddChild(new BButton({10, 2800, 90, 2820}, "far", "Far", nullptr));
        field->MakeFocus();
    }
    ~TestDialog() override { destroyed++; }

    int OnOK() override { return ++confirmed > refusals ? 1 : 0; }
    int HandleMessage(BMessage* message) override { return message->what == MessageOwn ? handled : 0; }

    static inline int destroyed = 0, confirmed = 0, refusals = 0, handled = 2;
};

void Press(const char* button) {
    Driver::Press(QApplication::activeModalWidget(), button);
}

// The dialog's own end comes a moment after its result.
void ExpectGone(int confirmed) {
    EXPECT_TRUE(QTest::qWaitFor([] { return TestDialog::destroyed == 1; }));
    EXPECT_EQ(TestDialog::confirmed, confirmed);
    TestDialog::destroyed = TestDialog::confirmed = 0;
}

TEST(BDialog, FlagsSayWhichButtonsThereAre) {
    const BApplication application("test");
    for (uint16 flags = 0; flags < 4; ++flags) {
        auto* dialog = new TestDialog(flags);
        dialog->ResizeTo(300, 250);
        const BView* ok = dialog->FindView("Ok button");
        const BView* cancel = dialog->FindView("cancel button");
        EXPECT_EQ((ok ? DialogHasOk : 0) | (cancel ? DialogHasCancel : 0), flags);
        if (ok && cancel) {
            EXPECT_FLOAT_EQ(cancel->Frame().right, 290);
            EXPECT_FLOAT_EQ(ok->Frame().right, 280 - cancel->Frame().Width());
            EXPECT_EQ(cancel->Frame().Height(), 1.5F * GetFontHeight(be_bold_font));
            EXPECT_EQ(cancel->Frame().bottom + ok->Frame().bottom, 2 * 230);
        }
    }
}

TEST(BDialog, IsWholeOnTheScreenWithItsButtonsAndItsTitle) {
    const BApplication application("test");
    constexpr const char* title = "A title that is a little longer";
    auto* dialog = new TestDialog(3, {5000, 5000, 5100, 8000}, title);
    Driver driver;
    driver.InField([] {
        const QWidget* shown = QApplication::activeModalWidget();
        EXPECT_TRUE(shown->screen()->availableGeometry().contains(shown->frameGeometry()));
        EXPECT_GT(shown->width(), shown->fontMetrics().horizontalAdvance(title) + 80);
        const auto isSeen = [&](const char* name) {
            const auto* button = shown->findChild<QPushButton*>(name);
            return button->visibleRegion().boundingRect() == button->rect();
        };
        EXPECT_TRUE(isSeen("Ok button") && isSeen("cancel button") && !isSeen("far"));
        shown->findChild<QPushButton*>("far")->setFocus();
        EXPECT_TRUE(isSeen("far"));
        Driver::Key(Qt::Key_Escape);
    });
    EXPECT_EQ(dialog->DoModal(), DialogCancel);
    ExpectGone(0);
}

TEST(BDialog, EveryWayOutHasItsResult) {
    const BApplication application("test");
    const std::tuple<uint32, int, std::function<void()>> cases[] = {
        {DialogOk, 1, [] { Driver::Key(Qt::Key_Return); }},
        {DialogOk, 1, [] { Press("Ok button"); }},
        {DialogOk, 0, [] { Press("own"); }},
        {DialogCancel, 0, [] { Press("cancel button"); }},
        {DialogCancel, 0, [] { Driver::Key(Qt::Key_Escape); }},
        {DialogCancel, 0, [] { QApplication::activeModalWidget()->close(); }},
        {DialogCancel, 0, [] { be_app->PostMessage(B_QUIT_REQUESTED); }}};
    for (int number = 0; const auto& [result, confirmed, way] : cases) {
        Driver driver;
        driver.InField(way);
        EXPECT_EQ((new TestDialog)->DoModal(), result) << number++;
        ExpectGone(confirmed);
    }
}

// The key that opened the dialog may still be down.
TEST(BDialog, TheRepeatsOfAHeldKeyPressNothing) {
    const BApplication application("test");
    const auto send = [](QEvent::Type type, quint64 time, bool repeat, int key = Qt::Key_Return) {
        QKeyEvent event(type, key, {}, "\r", repeat);
        event.setTimestamp(time);
        QApplication::sendEvent(Driver::Field(), &event);
    };
    Driver driver;
    driver.InField([&] {
        send(QEvent::KeyPress, 10, true);
        // Not always does the toolkit see that it is a repeat.
        send(QEvent::KeyRelease, 20, false);
        send(QEvent::KeyPress, 20, false);
        send(QEvent::KeyRelease, 25, false, Qt::Key_C);
        qt_sendShortcutOverrideEvent(Driver::Field(), 25, Qt::Key_C, Qt::AltModifier);
        EXPECT_FALSE(Driver::Window("Test")->findChild<QPushButton*>("cancel button")->isDown());
    });
    driver.InField([&] {
        EXPECT_EQ(TestDialog::confirmed, 0);
        send(QEvent::KeyPress, 30, false);
    });
    EXPECT_EQ((new TestDialog)->DoModal(), DialogOk);
    ExpectGone(1);
}

TEST(BDialog, ARefusedOkKeepsItOpenAsItIs) {
    const BApplication application("test");
    TestDialog::refusals = TestDialog::handled = 1;
    Driver driver;
    driver.InField([] { Driver::Type("more", Qt::Key_Return); });
    const auto refused = [] { return TestDialog::confirmed == 1; };
    driver.When("refused", refused, [] { Press("own"); });
    driver.When("still shown", Driver::WindowShown("Test"), [] {
        EXPECT_EQ(Driver::Window("Test")->findChild<QLineEdit*>()->text(), "more");
        Driver::Key(Qt::Key_Escape);
    });
    EXPECT_EQ((new TestDialog)->DoModal(), DialogCancel);
    ExpectGone(1);
}

TEST(BDialog, TheCallersWindowWaitsButPaints) {
    struct Painted : BView {
        Painted() : BView({0, 0, 99, 99}, "", B_FOLLOW_NONE, B_WILL_DRAW) {}
        void Draw(BRect) override { paints++; }
        int paints = 0;
    };
    Stage stage;
    auto* view = stage.Add(new Painted);
    uint32 result = 0;
    stage.window->inside = [&](uint32 code) {
        if (code == 1)
            result = (new TestDialog)->DoModal();
        else
            EXPECT_EQ(result, DialogOk); // a message that came meanwhile has waited
    };
    stage.Show();
    stage.window->PostMessage(1);
    Driver driver;
    driver.InField([&] {
        view->paints = 0;
        view->Invalidate();
        stage.window->PostMessage(2);
    });
    const auto painted = [&] { return view->paints > 0; };
    driver.When("a paint pass", painted, [] { Driver::Key(Qt::Key_Return); });
    EXPECT_EQ(stage.Received(2), (Codes{1, 2}));
}

TEST(BDialog, AWorkerCanRunOneAndItsStopEndsIt) {
    const BApplication application("test");
    for (const bool stopped : {false, true}) {
        std::atomic<uint32> result = 0;
        auto* dialog = new TestDialog;
        const Worker worker([&] { result = dialog->DoModal(); });
        Driver driver;
        driver.InField([&] { stopped ? void(kill_thread(worker.Id())) : Driver::Key(Qt::Key_Return); });
        EXPECT_TRUE(QTest::qWaitFor([&] { return result != 0; }));
        EXPECT_EQ(result, stopped ? DialogCancel : DialogOk);
        ExpectGone(stopped ? 0 : 1);
    }
}

} // namespace
