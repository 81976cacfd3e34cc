#include "platform/Button.h"

#include <QCheckBox>
#include <QPushButton>

#include "platform/private/Mnemonics.h"
#include "platform/private/ViewPeer.h"

namespace {

QPushButton* Widget(const BButton* button) {
    return static_cast<QPushButton*>(ViewAccess::Widget(button));
}

QCheckBox* Widget(const BCheckBox* box) {
    return static_cast<QCheckBox*>(ViewAccess::Widget(box));
}

} // namespace

BButton::BButton(BRect frame, const char* name, const char* label, BMessage* message, uint32 resizingMode,
                 uint32 flags)
    : BControl(frame, name, label, message, resizingMode, flags,
               std::make_unique<ViewPeer>(new QPushButton)) {
    ShowLabel(Widget(this), label);
    QObject::connect(Widget(this), &QPushButton::clicked, Widget(this), [this] { Invoke(); });
}

BCheckBox::BCheckBox(BRect frame, const char* name, const char* label, BMessage* message, uint32 resizingMode,
                     uint32 flags)
    : BControl(frame, name, label, message, resizingMode, flags, std::make_unique<ViewPeer>(new QCheckBox)) {
    ShowLabel(Widget(this), label);
    QObject::connect(Widget(this), &QCheckBox::clicked, Widget(this), [this](bool checked) {
        TakeValue(checked ? B_CONTROL_ON : B_CONTROL_OFF);
        Invoke();
    });
}

void BCheckBox::SetValue(int32 value) {
    const bool on = value != B_CONTROL_OFF;
    BControl::SetValue(on ? B_CONTROL_ON : B_CONTROL_OFF);
    Widget(this)->setChecked(on);
}
