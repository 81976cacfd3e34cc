#pragma once

#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <csignal>
#include <functional>
#include <string>

#include <fcntl.h>

#include "db/File.h"

enum class Fault {
    Error,         // the call does nothing and fails
    HalfThenError, // a write takes half of its bytes, then fails
    ShortWrite,    // a write takes half of its bytes and says so
    Twice,         // half, then an error, and the next call fails as well
    Broken,        // the same, and every later call fails
    Interrupted,   // the call is to be made again
    NoRead,        // a read fails; the reads are counted and nothing else
    KilledBefore,  // the process ends before the call
    KilledAfter,   // the process ends after the call
};

// The system's file operations, of which one call that changes something meets a fault. A read gives half of
// what is asked for. At the end no file may be open.
class FaultyFiles : public FileOperations {
  public:
    ~FaultyFiles() override { EXPECT_EQ(open_, 0); }

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
    // The permissions that the last new file began with.
    [[nodiscard]] mode_t FirstMode() const { return firstMode_; }
    // Makes every opening for writing fail so, as for a file that may only be read.
    void RefuseWriting(int error) { refused_ = error; }

    int Open(const char* path, int flags, mode_t mode) override {
        if ((flags & O_ACCMODE) == O_RDWR && refused_ != 0) {
            errno = refused_;
            return -1;
        }
        const auto call = [&] {
            const int file = FileOperations::Open(path, flags, mode);
            open_ += file >= 0 ? 1 : 0;
            return file;
        };
        if ((flags & O_CREAT) == 0) {
            return call();
        }
        firstMode_ = mode;
        return Meet<int>(call);
    }
    int Close(int file) override {
        --open_;
        return FileOperations::Close(file);
    }
    ssize_t ReadAt(int file, void* data, std::size_t size, off_t offset) override {
        if (fault_ == Fault::NoRead && calls_++ == at_) {
            errno = error_;
            return -1;
        }
        return FileOperations::ReadAt(file, data, (size + 1) / 2, offset);
    }
    ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
        order_ += 'w';
        const bool halved =
            calls_ == at_ && size > 1 && fault_ >= Fault::HalfThenError && fault_ <= Fault::Broken;
        if (!halved) {
            return Meet<ssize_t>([&] { return FileOperations::WriteAt(file, data, size, offset); });
        }
        const ssize_t half = FileOperations::WriteAt(file, data, size / 2, offset);
        return Meet<ssize_t>([half] { return half; });
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
        const int after = fault_ == Fault::NoRead ? -1 : calls_++ - at_;
        if (at_ < 0 || after < 0 ||
            after > (fault_ == Fault::Broken  ? INT_MAX
                     : fault_ == Fault::Twice ? 1
                                              : 0)) {
            return call();
        }
        switch (fault_) {
        case Fault::KilledAfter:
            call();
            [[fallthrough]];
        case Fault::KilledBefore:
            std::raise(SIGKILL);
            [[fallthrough]];
        case Fault::ShortWrite:
            return call();
        default:
            errno = fault_ == Fault::Interrupted ? EINTR : error_;
            return -1;
        }
    }

    Fault fault_ = Fault::Error;
    int at_ = -1;
    int error_ = ENOSPC;
    int calls_ = 0;
    int refused_ = 0;
    int open_ = 0;
    mode_t firstMode_ = 0;
    std::string order_;
};
