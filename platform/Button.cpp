#include "platform/Button.h"

#include <QPushButton>

#include "platform/private/Mnemonics.h"
#include "platform/private/ViewPeer.h"

namespace {

QPushButton* Widget(const BButton* button) {
    return static_cast<QPushButton*>(ViewAccess::Widget(button));
}

} // namespace

BButton::BButton(BRect frame, const char* name, const char* label, BMessage* message, uint32 resizingMode,
                 uint32 flags)
    : BControl(frame, name, label, message, resizingMode, flags,
               std::make_unique<ViewPeer>(new QPushButton)) {
    ShowLabel(Widget(this), label);
    QObject::connect(Widget(this), &QPushButton::clicked, Widget(this), [this] { Invoke(); });
}
