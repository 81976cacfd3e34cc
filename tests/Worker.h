#pragma once

#include <atomic>
#include <functional>

#include <QTest>

#include "platform/Kernel.h"

// A kernel thread that does one thing. The object's end waits for it, while the interface goes on.
class Worker {
  public:
    explicit Worker(std::function<void()> work) : work_(std::move(work)) {
        const auto run = [](void* data) {
            auto* worker = static_cast<Worker*>(data);
            worker->work_();
            worker->ended_ = true;
            return int32{0};
        };
        id_ = spawn_thread(run, "worker", suggest_thread_priority(), this);
        resume_thread(id_);
    }
    ~Worker() {
        while (!ended_)
            QTest::qWait(1);
    }

    [[nodiscard]] thread_id Id() const { return id_; }

  private:
    std::function<void()> work_;
    std::atomic<bool> ended_{false};
    thread_id id_;
};
