#pragma once

#include <deque>
#include <functional>
#include <mutex>

#include <QPointer>
#include <QSocketNotifier>

// Carries work from any thread to the interface thread, in order. The queue is our own and a file descriptor
// wakes the toolkit's loop, so that everything handed over is guarded by locks that thread checkers can see.
//
// One piece of work is done per wake-up: while it waits in a loop of its own, the inner loop goes on with the
// rest.
class PostBox {
  public:
    // On the interface thread, with the toolkit started.
    PostBox();
    ~PostBox();
    PostBox(const PostBox&) = delete;
    PostBox& operator=(const PostBox&) = delete;

    // Queues work, to be dropped when context (may be null) has died by then. Any thread.
    void Post(std::function<void()> work, QObject* context);

  private:
    struct Item {
        std::function<void()> work;
        QPointer<QObject> context;
        bool hasContext;
    };

    void Wake() const;
    void DoOne();

    std::mutex mutex_; // guards the queue
    std::deque<Item> queue_;
    int wakeFd_;
    QSocketNotifier notifier_;
};
