#include "dialogs/FieldForm.h"

#include <string>

#include "platform/TextControl.h"
#include "platform/View.h"

namespace {

constexpr float Width = 200;
constexpr float FirstHeight = 100;
constexpr float Margin = 10;

} // namespace

FieldForm::FieldForm(BPoint where, const char* title, const char* label, std::size_t maxBytes, uint16 flags)
    : BDialog({where.x, where.y, where.x + FormWidth(Width), where.y + FirstHeight}, title, flags) {
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
