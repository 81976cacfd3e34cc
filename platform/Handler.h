#pragma once

#include <memory>
#include <string>

#include "platform/Message.h"

class BLooper;
class LooperCore;
struct HandlerToken;

// Something that messages can be addressed to: a looper, a window, a view. It owns no queue; its looper does.
// A message that is still queued when its handler dies is dropped. Lives on the interface thread.
class BHandler {
  public:
    explicit BHandler(const char* name = nullptr);
    virtual ~BHandler();
    BHandler(const BHandler&) = delete;
    BHandler& operator=(const BHandler&) = delete;

    // Called with the looper's lock held, one message at a time. The message is the looper's; copy what must
    // last.
    virtual void MessageReceived(BMessage* message);

    [[nodiscard]] const char* Name() const { return name_.c_str(); }

    // The looper whose queue delivers this handler's messages; null while it belongs to none.
    [[nodiscard]] virtual BLooper* Looper() const { return nullptr; }

  private:
    friend class BLooper;
    friend class BMessenger;

    const std::string name_;
    std::shared_ptr<HandlerToken> token_;
};

// A safe address of a handler: it may outlive the handler, may be copied, and may be used from any thread.
// Sending to a handler that is gone fails and does nothing else.
class BMessenger {
  public:
    BMessenger() = default;
    // handler must belong to a looper; the messenger is invalid otherwise.
    explicit BMessenger(const BHandler* handler);

    // Queues a copy of message. B_OK, or B_BAD_VALUE when the target is gone.
    status_t SendMessage(const BMessage& message) const;
    [[nodiscard]] bool IsValid() const;

    // Locks the target's looper as BLooper::LockWithTimeout does; B_BAD_VALUE when the looper is gone. After
    // B_OK the looper stays alive until UnlockTarget.
    [[nodiscard]] status_t LockTargetWithTimeout(bigtime_t timeout) const;
    void UnlockTarget() const;

  private:
    std::shared_ptr<LooperCore> looper_;
    std::shared_ptr<HandlerToken> handler_;
};
