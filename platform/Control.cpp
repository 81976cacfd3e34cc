#include "platform/Control.h"

#include "platform/Window.h"
#include "platform/private/ViewPeer.h"

BInvoker::BInvoker(BMessage* message, const BHandler* target) : message_(message) {
    if (target)
        BInvoker::SetTarget(target);
}

BInvoker::~BInvoker() = default;

status_t BInvoker::SetTarget(const BHandler* target) {
    target_ = BMessenger(target);
    hasTarget_ = target != nullptr;
    return !target || target_.IsValid() ? B_OK : B_BAD_VALUE;
}

status_t BInvoker::Invoke() {
    return message_ ? (hasTarget_ ? target_ : DefaultTarget()).SendMessage(*message_) : B_BAD_VALUE;
}

BControl::BControl(BRect frame, const char* name, const char* label, BMessage* message, uint32 resizingMode,
                   uint32 flags, std::unique_ptr<ViewPeer> peer)
    : BView(frame, name, resizingMode, flags, std::move(peer)), BInvoker(message, nullptr) {
    Peer()->widget->setAccessibleName(QString::fromUtf8(label));
}

BControl::~BControl() = default;

BMessenger BControl::DefaultTarget() const {
    return BMessenger(Window());
}
