// The modal dialog base, worked with real events while its caller waits.
#include "Driver.h"
#include "Worker.h"

#include <atomic>

#include <QPushButton>

#include "dialogs/BDialog.h"
#include "platform/Button.h"
#include "platform/Font.h"
#include "platform/Stage.h"
#include "platform/TextControl.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr uint32 MessageIgnored = 3000;
constexpr uint32 MessageDone = 3001;

// Counts what it is told, accepts Ok only when it is let to, and has a field and two buttons of its own.
class TestDialog : public BDialog {
  public:
    explicit TestDialog(uint16 flags = DialogHasOk | DialogHasCancel)
        : BDialog({50, 50, 350, 200}, "Test", flags) {
        auto* field = new BTextControl({10, 10, 290, 30}, "field", "Field:", "text", nullptr);
        TopView()->AddChild(field);
        TopView()->AddChild(
            new BButton({10, 50, 90, 70}, "ignored", "Ignored", new BMessage(MessageIgnored)));
        TopView()->AddChild(new BButton({110, 50, 190, 70}, "done", "Done", new BMessage(MessageDone)));
        field->MakeFocus();
    }
    ~TestDialog() override { destroyed++; }

    int OnOK() override {
        confirmed++;
        return accepts ? 1 : 0;
    }
    int HandleMessage(BMessage* message) override {
        if (message->what == MessageDone)
            return 2;
        return message->what == MessageIgnored ? 1 : 0;
    }

    static inline int destroyed = 0;
    static inline int confirmed = 0;
    static inline bool accepts = true;
};

QWidget* Shown() {
    return Driver::Window("Test");
}

bool FieldHasFocus() {
    return Shown() && QApplication::focusWidget() && QApplication::focusWidget()->objectName() == "field";
}

// The dialog's own end comes a moment after its result.
void ExpectGone() {
    EXPECT_TRUE(QTest::qWaitFor([] { return TestDialog::destroyed == 1; }));
}

TEST(BDialog, FlagsSayWhichButtonsThereAre) {
    const BApplication application("test");
    for (uint16 flags = 0; flags < 4; ++flags) {
        auto* dialog = new TestDialog(flags);
        BView* ok = dialog->FindView("Ok button");
        BView* cancel = dialog->FindView("cancel button");
        EXPECT_EQ(ok != nullptr, (flags & DialogHasOk) != 0);
        EXPECT_EQ(cancel != nullptr, (flags & DialogHasCancel) != 0);
        if (ok && cancel) {
            const float height = GetFontHeight(be_bold_font);
            EXPECT_LT(ok->Frame().right, cancel->Frame().left);
            EXPECT_EQ(cancel->Frame().bottom, dialog->Bounds().bottom - 20);
            EXPECT_EQ(cancel->Frame().Height(), 1.5F * height);
            EXPECT_FLOAT_EQ(cancel->Frame().right, dialog->Bounds().right - 10);
            EXPECT_FLOAT_EQ(ok->Frame().Width(), cancel->Frame().Width());
            dialog->ResizeTo(300, 250);
            EXPECT_EQ(ok->Frame().bottom, 230);
            EXPECT_EQ(cancel->Frame().bottom, 230);
        }
        dialog->Quit();
    }
}

TEST(BDialog, EveryWayOutHasItsResult) {
    const BApplication application("test");
    const struct {
        const char* what;
        uint32 result;
        int confirmed;
        std::function<void()> way;
    } cases[] = {
        {"Enter in the field", DialogOk, 1, [] { Driver::Key(Qt::Key_Return); }},
        {"the Ok button", DialogOk, 1, [] { Driver::Press(Shown(), "Ok button"); }},
        {"the Cancel button", DialogCancel, 0, [] { Driver::Press(Shown(), "cancel button"); }},
        {"Escape", DialogCancel, 0, [] { Driver::Key(Qt::Key_Escape); }},
        {"the close box", DialogCancel, 0, [] { Shown()->close(); }},
        {"a control that ends it", DialogOk, 0, [] { Driver::Press(Shown(), "done"); }},
    };
    for (const auto& each : cases) {
        TestDialog::destroyed = TestDialog::confirmed = 0;
        Driver driver;
        driver.When(each.what, FieldHasFocus, each.way);
        EXPECT_EQ((new TestDialog)->DoModal(), each.result) << each.what;
        EXPECT_EQ(TestDialog::confirmed, each.confirmed) << each.what;
        ExpectGone();
    }
}

// The key that opened the dialog may still be down.
TEST(BDialog, TheRepeatsOfAHeldKeyPressNothing) {
    const BApplication application("test");
    TestDialog::destroyed = TestDialog::confirmed = 0;
    const auto send = [](QEvent::Type type, quint64 time, bool repeat, int key = Qt::Key_Return) {
        QKeyEvent event(type, key, {}, "\r", repeat);
        event.setTimestamp(time);
        QApplication::sendEvent(QApplication::focusWidget(), &event);
    };
    Driver driver;
    driver.When(
        "dialog", FieldHasFocus,
        [&] {
            send(QEvent::KeyPress, 10, true);
            // Not always does the toolkit see that it is a repeat.
            send(QEvent::KeyRelease, 20, false);
            send(QEvent::KeyPress, 20, false);
            send(QEvent::KeyRelease, 25, false, Qt::Key_C);
            qt_sendShortcutOverrideEvent(QApplication::focusWidget(), 25, Qt::Key_C, Qt::AltModifier);
            EXPECT_FALSE(Shown()->findChild<QPushButton*>("cancel button")->isDown());
        });
    driver.When(
        "nothing", [] { return FieldHasFocus(); },
        [&] {
            EXPECT_EQ(TestDialog::confirmed, 0);
            send(QEvent::KeyPress, 30, false);
        });
    EXPECT_EQ((new TestDialog)->DoModal(), DialogOk);
    EXPECT_EQ(TestDialog::confirmed, 1);
    ExpectGone();
}

TEST(BDialog, ARefusedOkKeepsItOpenAsItIs) {
    const BApplication application("test");
    TestDialog::accepts = false;
    Driver driver;
    driver.When("dialog", FieldHasFocus, [] { Driver::Type("more", Qt::Key_Return); })
        .When(
            "refused", [] { return TestDialog::confirmed == 1; }, [] { Driver::Press(Shown(), "ignored"); })
        .When("still shown", Shown, [] {
            EXPECT_EQ(Shown()->findChild<QLineEdit*>("field")->text(), "more");
            Driver::Key(Qt::Key_Escape);
        });
    EXPECT_EQ((new TestDialog)->DoModal(), DialogCancel);
    EXPECT_EQ(TestDialog::confirmed, 1);
    ExpectGone();
}

TEST(BDialog, TheCallersWindowWaitsButPaints) {
    struct Painted : BView {
        using BView::BView;
        void Draw(BRect) override { paints++; }
        int paints = 0;
    };
    Stage stage;
    auto* view = stage.Add(new Painted(BRect(0, 0, 99, 99), "", B_FOLLOW_ALL_SIDES, B_WILL_DRAW));
    uint32 result = 0;
    stage.window->inside = [&](uint32 code) {
        if (code == 1)
            result = (new TestDialog)->DoModal();
        else
            EXPECT_EQ(result, DialogOk); // a message that came meanwhile has waited
    };
    stage.Show();
    stage.window->PostMessage(1);
    int before = 0;
    Driver driver;
    driver.When(
        "dialog", FieldHasFocus,
        [&] {
            before = view->paints;
            view->Invalidate();
            stage.window->PostMessage(2);
        });
    driver.When(
        "a paint pass", [&] { return view->paints > before; }, [] { Driver::Key(Qt::Key_Return); });
    EXPECT_EQ(stage.Received(2), (Codes{1, 2}));
}

TEST(BDialog, AWorkerCanRunOneAndItsStopEndsIt) {
    const BApplication application("test");
    for (const bool stopped : {false, true}) {
        TestDialog::destroyed = 0;
        std::atomic<uint32> result = 0;
        auto* dialog = new TestDialog;
        Driver driver;
        const Worker worker([&] {
            result = dialog->DoModal();
            return 0;
        });
        driver.When(
            "dialog", FieldHasFocus,
            [&] {
                if (stopped)
                    kill_thread(worker.Id());
                else
                    Driver::Key(Qt::Key_Return);
            });
        EXPECT_TRUE(QTest::qWaitFor([&] { return result != 0; }));
        EXPECT_EQ(result, stopped ? DialogCancel : DialogOk);
        ExpectGone();
    }
}

// Also while a window's handler waits for it.
TEST(BDialog, TheApplicationsQuitEndsIt) {
    Stage stage;
    uint32 result = DialogOk;
    stage.window->inside = [&](uint32) { result = (new TestDialog)->DoModal(); };
    stage.Show();
    stage.window->PostMessage(1);
    Driver driver;
    driver.When("dialog", FieldHasFocus, [&] { stage.application.PostMessage(B_QUIT_REQUESTED); });
    stage.application.Run();
    EXPECT_EQ(result, DialogCancel);
    EXPECT_EQ(TestDialog::confirmed, 0);
    EXPECT_EQ(TestDialog::destroyed, 1);
    EXPECT_EQ(stage.application.CountWindows(), 0);
}

} // namespace
