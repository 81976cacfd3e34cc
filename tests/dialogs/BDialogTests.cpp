// The modal dialog base, worked with real events while its caller waits.
#include "Driver.h"

#include <QLineEdit>

#include <atomic>

#include "dialogs/BDialog.h"
#include "platform/Button.h"
#include "platform/Font.h"
#include "platform/Kernel.h"
#include "platform/TextControl.h"
#include "util/InterfaceHelpers.h"

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

void PressKey(Qt::Key key) {
    QTest::keyClick(QApplication::focusWidget(), key);
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
        {"Enter in the field", DialogOk, 1, [] { PressKey(Qt::Key_Return); }},
        {"the Ok button", DialogOk, 1, [] { Driver::Press(Shown(), "Ok button"); }},
        {"the Cancel button", DialogCancel, 0, [] { Driver::Press(Shown(), "cancel button"); }},
        {"Escape", DialogCancel, 0, [] { PressKey(Qt::Key_Escape); }},
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

TEST(BDialog, ARefusedOkKeepsItOpenAsItIs) {
    const BApplication application("test");
    TestDialog::accepts = false;
    Driver driver;
    driver.When("dialog", FieldHasFocus, [] { QTest::keyClicks(QApplication::focusWidget(), "more"); })
        .When("typed", FieldHasFocus, [] { PressKey(Qt::Key_Return); })
        .When(
            "refused", [] { return TestDialog::confirmed == 1; }, [] { Driver::Press(Shown(), "ignored"); })
        .When(
            "still shown", [] { return Shown() != nullptr; },
            [] {
                EXPECT_EQ(Shown()->findChild<QLineEdit*>("field")->text(), "more");
                PressKey(Qt::Key_Escape);
            });
    EXPECT_EQ((new TestDialog)->DoModal(), DialogCancel);
    EXPECT_EQ(TestDialog::confirmed, 1);
    ExpectGone();
}

TEST(BDialog, TheCallersWindowWaitsButPaints) {
    BApplication application("test");
    static constexpr uint32 Run = 1;
    static constexpr uint32 Later = 2;
    struct Caller : BWindow {
        struct Painted : BView {
            using BView::BView;
            void Draw(BRect) override { paints++; }
            int paints = 0;
        };
        Caller() : BWindow({10, 10, 200, 200}, "Caller", B_TITLED_WINDOW, 0) {
            view = new Painted(Bounds(), "", B_FOLLOW_ALL_SIDES, B_WILL_DRAW);
            AddChild(view);
        }
        void MessageReceived(BMessage* message) override {
            if (message->what == Run)
                result = (new TestDialog)->DoModal();
            else if (message->what == Later)
                laterCameAt = result;
            else
                BWindow::MessageReceived(message);
        }
        Painted* view;
        uint32 result = 0;
        uint32 laterCameAt = 0;
    };
    auto* caller = new Caller;
    caller->Show();
    caller->PostMessage(Run);
    int before = 0;
    Driver driver;
    driver
        .When("dialog", FieldHasFocus,
              [&] {
                  before = caller->view->paints;
                  caller->view->Invalidate();
                  caller->PostMessage(Later);
              })
        .When(
            "a paint pass", [&] { return caller->view->paints > before; },
            [&] {
                EXPECT_EQ(caller->laterCameAt, 0U);
                PressKey(Qt::Key_Return);
            })
        .When(
            "the message that waited", [&] { return caller->laterCameAt != 0; },
            [&] {
                EXPECT_EQ(caller->laterCameAt, DialogOk);
                application.PostMessage(B_QUIT_REQUESTED);
            });
    application.Run();
}

// A worker's DoModal; result is there once Done says so.
struct Worker {
    explicit Worker(BDialog* d) : dialog(d) {
        id = spawn_thread(
            [](void* data) {
                auto* self = static_cast<Worker*>(data);
                self->result = self->dialog->DoModal();
                return int32{0};
            },
            "worker", B_NORMAL_PRIORITY, this);
        resume_thread(id);
    }
    BDialog* dialog;
    std::atomic<uint32> result = 0;
    thread_id id;
};

TEST(BDialog, AWorkerCanRunOne) {
    const BApplication application("test");
    Driver driver;
    driver.When("dialog", FieldHasFocus, [] { PressKey(Qt::Key_Return); });
    Worker worker(new TestDialog);
    EXPECT_TRUE(QTest::qWaitFor([&] { return worker.result != 0; }));
    EXPECT_EQ(worker.result, DialogOk);
    ExpectGone();
}

TEST(BDialog, AStoppedWorkerTakesItsDialogAlong) {
    const BApplication application("test");
    Driver driver;
    Worker worker(new TestDialog);
    driver.When("dialog", FieldHasFocus, [&] { kill_thread(worker.id); });
    EXPECT_TRUE(QTest::qWaitFor([&] { return worker.result != 0; }));
    EXPECT_EQ(worker.result, DialogCancel);
    ExpectGone();
}

TEST(BDialog, TheApplicationsQuitEndsIt) {
    BApplication application("test");
    Driver driver;
    driver.When("dialog", FieldHasFocus, [&] { application.PostMessage(B_QUIT_REQUESTED); });
    EXPECT_EQ((new TestDialog)->DoModal(), DialogCancel);
    EXPECT_EQ(TestDialog::confirmed, 0);
    application.Run();
    ExpectGone();
}

} // namespace
