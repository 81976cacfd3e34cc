#include "dialogs/BDialog.h"

#include <algorithm>
#include <atomic>
#include <cmath>
#include <string>

#include "platform/Application.h"
#include "platform/Button.h"
#include "platform/Kernel.h"
#include "platform/ScrollView.h"
#include "platform/TextControl.h"
#include "platform/View.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

// Asks the interface thread to show a dialog that runs for another thread.
constexpr uint32 MessageShow = 2000;

constexpr float BottomMargin = 20;
constexpr float RightMargin = 10;
constexpr const char* WidestLabel = "  Cancel  ";

// As wide as the screen at most, with a scroll bar.
BRect Narrowed(BRect frame) {
    const float room = BWindow::RoomAt(frame.LeftTop()).Width() - B_FORM_BAR_WIDTH;
    frame.right = std::min(frame.right, frame.left + room);
    return frame;
}

constexpr float FieldFormWidth = 200;
constexpr float FirstHeight = 100;
constexpr float Margin = 10;

} // namespace

struct BDialog::Outcome {
    sem_id semaphore = -1;
    std::atomic<uint32> result = DialogCancel;
    std::atomic<bool> ended = false;

    void End(uint32 with) {
        if (ended.exchange(true))
            return;
        result = with;
        delete_sem(semaphore);
    }
};

BDialog::BDialog(BRect frame, const char* title, uint16 flags)
    : BWindow(Narrowed(frame), title, B_FLOATING_WINDOW_LOOK, B_MODAL_APP_WINDOW_FEEL,
              B_NOT_RESIZABLE | B_NOT_ZOOMABLE | B_WILL_ACCEPT_FIRST_CLICK),
      topView_(AddTopView(*this)),
      fontHeight_(GetFontHeight(be_bold_font)),
      outcome_(std::make_shared<Outcome>()) {
    BRect above = Bounds();
    above.bottom = AddButtons(flags) - 1;
    form_ = new BFormView(above, "form", B_FOLLOW_ALL_SIDES);
    topView_->AddChild(form_);
}

BDialog::~BDialog() {
    outcome_->End(DialogCancel);
}

float BDialog::FormWidth(float usual) {
    return std::ceil(usual * GetFontGrowth());
}

float BDialog::AddButtons(uint16 flags) {
    const BRect bounds = Bounds();
    const float width = topView_->StringWidth(WidestLabel);
    const float step = width + RightMargin;
    const float bottom = bounds.bottom - BottomMargin;
    BRect frame(bounds.right - 2 * step, bottom - 1.5F * fontHeight_, bounds.right - 2 * step + width,
                bottom);
    if (flags & DialogHasOk) {
        auto* ok =
            new BButton(frame, "Ok button", "Ok", new BMessage(DialogOk), B_FOLLOW_LEFT | B_FOLLOW_BOTTOM);
        topView_->AddChild(ok);
        SetDefaultButton(ok);
    }
    frame.OffsetBy(step, 0);
    if (flags & DialogHasCancel)
        topView_->AddChild(new BButton(frame, "cancel button", "Cancel", new BMessage(DialogCancel),
                                       B_FOLLOW_RIGHT | B_FOLLOW_BOTTOM));
    return frame.top;
}

void BDialog::Show() {
    const float room = RoomAt(Frame().LeftTop()).Height();
    if (Bounds().Height() > room)
        ResizeTo(Bounds().Width() + B_FORM_BAR_WIDTH, room);
    BWindow::Show();
}

uint32 BDialog::DoModal() {
    const std::shared_ptr<Outcome> outcome = outcome_;
    const BMessenger self(this);
    const sem_id semaphore = create_sem(0, "ModalSem");
    outcome->semaphore = semaphore;
    // Windows are shown by the interface thread, which alone holds the lock of one that was never shown.
    // Another thread asks for it through the application's queue: a hidden window does not serve its own yet.
    if (IsLocked()) {
        Show();
    } else {
        const BMessage show(MessageShow);
        be_app->PostMessage(&show, this);
    }

    // Nobody releases the semaphore; its end is the dialog's. The wait itself keeps the windows painted.
    status_t status = B_OK;
    while (status == B_OK || status == B_TIMED_OUT)
        status = acquire_sem_etc(semaphore, 1, B_RELATIVE_TIMEOUT, B_INFINITE_TIMEOUT);

    if (status == B_INTERRUPTED && self.LockTargetWithTimeout(B_INFINITE_TIMEOUT) == B_OK) {
        // The dialog is still there; with its lock held nothing is in the middle of writing the caller's
        // buffers.
        outcome->End(DialogCancel);
        self.UnlockTarget();
    }
    self.SendMessage(BMessage(B_QUIT_REQUESTED));
    return outcome->result;
}

void BDialog::EndDialog(uint32 result) {
    Hide();
    outcome_->End(result);
}

void BDialog::MessageReceived(BMessage* message) {
    if (message->what == MessageShow) {
        Show();
        return;
    }
    if (outcome_->ended && message->what != B_QUIT_REQUESTED)
        return;
    switch (message->what) {
    case DialogCancel:
        EndDialog(DialogCancel);
        return;
    case DialogOk:
        if (OnOK() == 1)
            EndDialog(DialogOk);
        return;
    default:
        break;
    }
    const int handled = HandleMessage(message);
    if (handled == 0)
        BWindow::MessageReceived(message);
    else if (handled == 2)
        EndDialog(DialogOk);
}

FieldForm::FieldForm(BPoint where, const char* title, const char* label, std::size_t maxBytes, uint16 flags)
    : BDialog({where.x, where.y, where.x + FormWidth(FieldFormWidth), where.y + FirstHeight}, title, flags) {
    ResizeTo(Bounds().Width(), 7 * FontHeight());
    const BRect frame(Margin, Margin, Bounds().right - Margin, Margin + 1.5F * FontHeight());
    field_ = new BTextControl(frame, "text control", label, "", B_FOLLOW_LEFT | B_FOLLOW_TOP,
                              B_WILL_DRAW | B_NAVIGABLE);
    field_->SetDivider(Form()->StringWidth((label + std::string(" ")).c_str()));
    field_->SetMaxBytes(static_cast<int32>(maxBytes));
    Form()->AddChild(field_);
}

void FieldForm::SetText(const char* text) {
    field_->SetText(text);
    field_->MakeFocus();
}

const char* FieldForm::Text() const {
    return field_->Text();
}
