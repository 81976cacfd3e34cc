#pragma once

#include <cerrno>
#include <csignal>
#include <functional>
#include <string>

#include <fcntl.h>

#include "db/File.h"

enum class Fault {
    Error,         // the call does nothing and fails
    HalfThenError, // a write takes half of its bytes, then fails
    ShortWrite,    // a write takes half of its bytes and says so
    Broken,        // the same, and every later call fails
    Interrupted,   // the call is to be made again
    KilledBefore,  // the process ends before the call
    KilledAfter,   // the process ends after the call
};

// The system's file operations, of which one call that changes something meets a fault.
class FaultyFiles : public FileOperations {
  public:
    // Lets the call numbered `at` (from 0, counted from now on) meet the fault.
    void Arm(Fault fault, int at, int error = ENOSPC) {
        fault_ = fault;
        at_ = at;
        error_ = error;
        calls_ = 0;
    }
    // Tells whether that call was reached, and lets nothing fail from now on.
    bool Disarm() {
        const bool met = at_ >= 0 && calls_ > at_;
        at_ = -1;
        return met;
    }
    // A letter for each write, sync, rename and removal so far: w, s, r, x.
    [[nodiscard]] const std::string& Order() const { return order_; }
    // Makes every opening for writing fail so, as for a file that may only be read.
    void RefuseWriting(int error) { refused_ = error; }

    int Open(const char* path, int flags, mode_t mode) override {
        if ((flags & O_ACCMODE) == O_RDWR && refused_ != 0) {
            errno = refused_;
            return -1;
        }
        const auto call = [&] { return FileOperations::Open(path, flags, mode); };
        return (flags & O_CREAT) != 0 ? Meet<int>(call) : call();
    }
    ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
        order_ += 'w';
        const bool now = calls_ == at_;
        if (now && size > 1 &&
            (fault_ == Fault::ShortWrite || fault_ == Fault::HalfThenError || fault_ == Fault::Broken)) {
            if (fault_ == Fault::ShortWrite) {
                ++calls_;
            }
            const ssize_t half = FileOperations::WriteAt(file, data, size / 2, offset);
            return fault_ == Fault::ShortWrite ? half : Meet<ssize_t>([half] { return half; });
        }
        return Meet<ssize_t>([&] { return FileOperations::WriteAt(file, data, size, offset); });
    }
    int Truncate(int file, off_t length) override {
        return Meet<int>([&] { return FileOperations::Truncate(file, length); });
    }
    int Sync(int file) override {
        order_ += 's';
        return Meet<int>([&] { return FileOperations::Sync(file); });
    }
    int SetOwner(int file, uid_t owner, gid_t group) override {
        return Meet<int>([&] { return FileOperations::SetOwner(file, owner, group); });
    }
    int SetMode(int file, mode_t mode) override {
        return Meet<int>([&] { return FileOperations::SetMode(file, mode); });
    }
    int Rename(const char* from, const char* to) override {
        order_ += 'r';
        return Meet<int>([&] { return FileOperations::Rename(from, to); });
    }
    int Remove(const char* path) override {
        order_ += 'x';
        return Meet<int>([&] { return FileOperations::Remove(path); });
    }

  private:
    template <class Result>
    Result Meet(const std::function<Result()>& call) {
        const int number = calls_++;
        if (at_ < 0 || number < at_ || (number > at_ && fault_ != Fault::Broken)) {
            return call();
        }
        switch (fault_) {
        case Fault::Broken:
        case Fault::Error:
        case Fault::HalfThenError:
            errno = error_;
            return -1;
        case Fault::Interrupted:
            errno = EINTR;
            return -1;
        case Fault::ShortWrite:
            break;
        case Fault::KilledBefore:
            std::raise(SIGKILL);
            break;
        case Fault::KilledAfter:
            call();
            std::raise(SIGKILL);
            break;
        }
        return call();
    }

    Fault fault_ = Fault::Error;
    int at_ = -1;
    int error_ = ENOSPC;
    int calls_ = 0;
    int refused_ = 0;
    std::string order_;
};
