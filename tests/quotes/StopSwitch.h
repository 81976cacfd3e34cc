#pragma once

#include <cstdint>
#include <sys/eventfd.h>
#include <unistd.h>

// A descriptor that becomes readable once a call shall stop.
class StopSwitch {
  public:
    StopSwitch() = default;
    StopSwitch(const StopSwitch&) = delete;
    StopSwitch& operator=(const StopSwitch&) = delete;
    ~StopSwitch() { close(fd_); }

    void Stop() const {
        const std::uint64_t one = 1;
        (void)!write(fd_, &one, sizeof one);
    }
    [[nodiscard]] int Fd() const { return fd_; }

  private:
    int fd_ = eventfd(0, EFD_CLOEXEC);
};
