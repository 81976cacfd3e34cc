#pragma once

#include "platform/Handler.h"

// A queue of messages with a lock. All loopers are served by the one interface thread, yet each keeps what
// can be observed of a loop of its own: it handles one message at a time, in the order in which they were
// posted, with its lock held; while a handler waits (a modal dialog), what is posted to the same looper waits
// in its queue, and other loopers go on.
//
// PostMessage, Lock, LockWithTimeout and Unlock may be called from any thread; everything else only on the
// interface thread. A message, a paint pass or an event that finds the lock taken by a worker waits for it: a
// worker holds it for moments only, and must not wait for the interface thread meanwhile.
class BLooper : public BHandler {
  public:
    explicit BLooper(const char* name = nullptr);
    ~BLooper() override;

    // Queues a copy of message for handler (null: the looper itself). B_OK, or B_BAD_VALUE when the looper is
    // quitting.
    status_t PostMessage(const BMessage* message, BHandler* handler = nullptr);
    status_t PostMessage(uint32 code, BHandler* handler = nullptr);

    // The lock is recursive. Lock waits without limit and returns false only when the looper is gone.
    bool Lock();
    // Waits at most timeout microseconds. B_OK, or B_TIMED_OUT.
    [[nodiscard]] status_t LockWithTimeout(bigtime_t timeout);
    void Unlock();
    // Whether the calling thread holds the lock.
    [[nodiscard]] bool IsLocked() const;

    // The message being handled; null outside a handler. In a mouse hook it is the press, with the fields
    // "where" (point), "buttons" and "modifiers" (int32).
    [[nodiscard]] BMessage* CurrentMessage() const;

    // Handles a message that no override took: B_QUIT_REQUESTED asks QuitRequested and then calls Quit.
    void MessageReceived(BMessage* message) override;
    // Whether the looper may quit now. The base says yes.
    virtual bool QuitRequested() { return true; }
    // Ends the looper and deletes it: at once, or as soon as the handler that is running returns. What is
    // still queued is dropped. The caller must not touch the looper afterwards.
    virtual void Quit();

    [[nodiscard]] BLooper* Looper() const override { return const_cast<BLooper*>(this); }

  protected:
    // Gives one message to its handler; windows and the application may look at it first.
    virtual void DispatchMessage(BMessage* message, BHandler* handler);

  private:
    friend class LooperCore;
    friend class BMessenger;
    friend struct LooperAccess;

    std::shared_ptr<LooperCore> core_;
};
