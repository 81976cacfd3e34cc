#pragma once

#include <functional>

#include "platform/Kernel.h"

// A kernel thread that does one thing. The object's end waits for it, while the interface goes on.
class Worker {
  public:
    explicit Worker(std::function<int32()> work) : work_(std::move(work)) {
        id_ = spawn_thread([](void* data) { return static_cast<Worker*>(data)->work_(); }, "worker",
                           suggest_thread_priority(), this);
        resume_thread(id_);
    }
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;
    ~Worker() { wait_for_thread(id_, nullptr); }

    [[nodiscard]] thread_id Id() const { return id_; }

  private:
    std::function<int32()> work_;
    thread_id id_;
};
