#include "platform/Looper.h"

#include "platform/private/Loop.h"
#include "platform/private/LooperCore.h"

status_t LooperCore::Enqueue(const BMessage& message, std::shared_ptr<HandlerToken> handler) {
    const bool forLooper = handler == nullptr;
    {
        const std::lock_guard guard(mutex_);
        if (!alive_)
            return B_BAD_VALUE;
        queue_.push_back({message, std::move(handler), forLooper});
    }
    Wake();
    return B_OK;
}

void LooperCore::Wake() {
    {
        const std::lock_guard guard(mutex_);
        if (wakePending_)
            return;
        wakePending_ = true;
    }
    RunOnInterfaceThread([self = shared_from_this()] { self->ServeNext(); });
}

status_t LooperCore::Lock(bigtime_t timeout) {
    const auto caller = std::this_thread::get_id();
    std::unique_lock guard(mutex_);
    const auto obtainable = [&] { return !alive_ || depth_ == 0 || holder_ == caller; };
    if (timeout == B_INFINITE_TIMEOUT)
        released_.wait(guard, obtainable);
    else if (!released_.wait_for(guard, std::chrono::microseconds(timeout), obtainable))
        return B_TIMED_OUT;
    if (!alive_)
        return B_BAD_VALUE;
    holder_ = caller;
    ++depth_;
    return B_OK;
}

void LooperCore::Unlock() {
    const std::lock_guard guard(mutex_);
    if (depth_ == 0 || holder_ != std::this_thread::get_id())
        return;
    if (--depth_ == 0)
        released_.notify_all();
}

bool LooperCore::IsLockedByCaller() const {
    const std::lock_guard guard(mutex_);
    return depth_ > 0 && holder_ == std::this_thread::get_id();
}

bool LooperCore::IsAlive() const {
    const std::lock_guard guard(mutex_);
    return alive_;
}

void LooperCore::ServeNext() {
    {
        const std::lock_guard guard(mutex_);
        wakePending_ = false;
        if (!alive_ || queue_.empty() || handling_ > 0)
            return;
    }
    if (Lock(B_INFINITE_TIMEOUT) != B_OK)
        return;
    Queued next;
    {
        const std::lock_guard guard(mutex_);
        next = std::move(queue_.front());
        queue_.pop_front();
    }
    Deliver(std::move(next));
}

void LooperCore::Deliver(Queued queued) {
    BHandler* handler = queued.forLooper ? looper_ : queued.handler->handler.load();
    ++handling_;
    if (handler) {
        BMessage* outer = current_;
        current_ = &queued.message;
        LooperAccess::Dispatch(*looper_, &queued.message, handler);
        current_ = outer;
    }
    --handling_;
    Unlock();
    if (destroyWhenDone_) {
        Destroy();
        return;
    }
    bool more = false;
    {
        const std::lock_guard guard(mutex_);
        more = alive_ && !queue_.empty();
    }
    if (more)
        Wake();
}

void LooperCore::Destroy() {
    if (destroying_)
        return;
    if (handling_ > 0) {
        destroyWhenDone_ = true;
        return;
    }
    const auto self = shared_from_this();
    if (Lock(B_INFINITE_TIMEOUT) == B_OK) {
        destroying_ = true;
        delete looper_;
    }
}

void LooperCore::MarkDead() {
    const std::lock_guard guard(mutex_);
    alive_ = false;
    depth_ = 0;
    queue_.clear();
    released_.notify_all();
}

BLooper::BLooper(const char* name) : BHandler(name), core_(std::make_shared<LooperCore>(this)) {}

BLooper::~BLooper() {
    core_->MarkDead();
}

status_t BLooper::PostMessage(const BMessage* message, BHandler* handler) {
    return core_->Enqueue(*message, handler ? handler->token_ : nullptr);
}

status_t BLooper::PostMessage(uint32 code, BHandler* handler) {
    const BMessage message(code);
    return PostMessage(&message, handler);
}

bool BLooper::Lock() {
    return core_->Lock(B_INFINITE_TIMEOUT) == B_OK;
}

status_t BLooper::LockWithTimeout(bigtime_t timeout) {
    return core_->Lock(timeout);
}

void BLooper::Unlock() {
    core_->Unlock();
}

bool BLooper::IsLocked() const {
    return core_->IsLockedByCaller();
}

BMessage* BLooper::CurrentMessage() const {
    return core_->Current();
}

void BLooper::MessageReceived(BMessage* message) {
    if (message->what != B_QUIT_REQUESTED)
        BHandler::MessageReceived(message);
    else if (QuitRequested())
        Quit();
}

void BLooper::Quit() {
    core_->Destroy();
}

void BLooper::DispatchMessage(BMessage* message, BHandler* handler) {
    handler->MessageReceived(message);
}
