#include "dialogs/PasswordForm.h"

#include "platform/TextControl.h"
#include "platform/View.h"

namespace {

constexpr float Width = 200;
constexpr float FirstHeight = 100;
constexpr float Margin = 10;

} // namespace

PasswordForm::PasswordForm(BPoint where, const char* title, uint16 flags)
    : BDialog({where.x, where.y, where.x + FormWidth(Width), where.y + FirstHeight}, title, flags) {
    ResizeTo(Bounds().Width(), 7 * FontHeight());
    const BRect frame(Margin, Margin, Bounds().right - Margin, Margin + 1.5F * FontHeight());
    passwordControl_ = new BTextControl(frame, "text control", "Password:", "", nullptr,
                                        B_FOLLOW_LEFT | B_FOLLOW_TOP, B_WILL_DRAW | B_NAVIGABLE);
    passwordControl_->SetDivider(TopView()->StringWidth("Password: "));
    passwordControl_->SetMaxBytes(PasswordSize - 1);
    TopView()->AddChild(passwordControl_);
}

void PasswordForm::SetPassword(const char* password) {
    passwordControl_->SetText(password);
    passwordControl_->MakeFocus();
}

const char* PasswordForm::Password() const {
    return passwordControl_->Text();
}
