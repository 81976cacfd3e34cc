#pragma once

#include <atomic>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <thread>

#include "platform/Looper.h"

// Tells whether a handler still lives; shared by the handler, queued messages and messengers. The pointer is
// followed on the interface thread only.
struct HandlerToken {
    std::atomic<BHandler*> handler;
};

// The part of a looper that may outlive it: its queue and its lock. Shared by the looper, messengers, and
// wake-ups that are on their way. Any thread may queue and lock; serving happens on the interface thread.
class LooperCore : public std::enable_shared_from_this<LooperCore> {
  public:
    explicit LooperCore(BLooper* looper) : looper_(looper) {}

    // A null handler means the looper. B_BAD_VALUE when the looper is gone.
    status_t Enqueue(const BMessage& message, std::shared_ptr<HandlerToken> handler);

    // B_OK, B_TIMED_OUT, or B_BAD_VALUE when the looper is gone.
    status_t Lock(bigtime_t timeout);
    void Unlock();
    bool IsLockedByCaller() const;
    bool IsAlive() const;

    // Interface thread: handles the next message, unless a handler is running already.
    void ServeNext();
    // Interface thread: deletes the looper now or when its handler returns.
    void Destroy();
    // Interface thread, from the looper's destructor: nobody may lock or queue any more.
    void MarkDead();

    BMessage* Current() const { return current_; }
    void SetCurrent(BMessage* message) { current_ = message; }

  private:
    struct Queued {
        BMessage message;
        std::shared_ptr<HandlerToken> handler;
        bool forLooper;
    };

    void Wake();
    void Deliver(Queued queued);

    mutable std::mutex mutex_; // guards what follows, down to the blank line
    std::condition_variable released_;
    std::deque<Queued> queue_;
    std::thread::id holder_;
    int32 depth_ = 0;
    bool alive_ = true;
    bool wakePending_ = false;

    // Interface thread only.
    BLooper* looper_;
    BMessage* current_ = nullptr;
    int32 handling_ = 0;
    bool destroyWhenDone_ = false;
    bool destroying_ = false; // a destructor that waits for a thread serves the loop, which may ask again
};

struct LooperAccess {
    static LooperCore& Core(const BLooper& looper) { return *looper.core_; }
    static void Dispatch(BLooper& looper, BMessage* message, BHandler* handler) {
        looper.DispatchMessage(message, handler);
    }
};
