#include "platform/Handler.h"

#include "platform/private/LooperCore.h"

BHandler::BHandler(const char* name) : name_(name ? name : ""), token_(std::make_shared<HandlerToken>()) {
    token_->handler = this;
}

BHandler::~BHandler() {
    token_->handler = nullptr;
}

void BHandler::MessageReceived(BMessage*) {}

BMessenger::BMessenger(const BHandler* handler) {
    const BLooper* looper = handler ? handler->Looper() : nullptr;
    if (!looper)
        return;
    looper_ = looper->core_;
    handler_ = handler->token_;
}

status_t BMessenger::SendMessage(const BMessage& message) const {
    return IsValid() ? looper_->Enqueue(message, handler_) : B_BAD_VALUE;
}

bool BMessenger::IsValid() const {
    return looper_ && handler_->handler != nullptr && looper_->IsAlive();
}

status_t BMessenger::LockTargetWithTimeout(bigtime_t timeout) const {
    return looper_ ? looper_->Lock(timeout) : B_BAD_VALUE;
}

void BMessenger::UnlockTarget() const {
    if (looper_)
        looper_->Unlock();
}
