#pragma once

#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <csignal>
#include <functional>
#include <memory>
#include <string>
#include <utility>

#include <fcntl.h>

#include "db/Database.h"
#include "util/File.h"

enum class Fault {
    Error,         // the call does nothing and fails
    HalfThenError, // a write takes half of its bytes, then fails
    ShortWrite,    // a write takes half of its bytes and says so
    Broken,        // half, then an error, and every later call fails
    Interrupted,   // the call is to be made again
    NoRead,        // a read fails; the reads are counted and nothing else
    NoReads,       // the same, and every later read fails
    KilledBefore,  // the process ends before the call
    KilledAfter,   // the process ends after the call
};

// The system's file operations, of which one call that changes something meets a fault. A read gives half of
// what is asked for. At the end no file may be open.
class FaultyFiles : public FileOperations {
    using System = FileOperations;

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
    // Whether changes reached the disk since this was last asked, and all of them.
    [[nodiscard]] bool HaveSynced() { return std::exchange(order_, "").ends_with('s'); }
    // Called before each write (w) and sync (s), which fails when it says no.
    std::function<bool(char)> may = [](char) { return true; };
    // Opens a file of a running program anew; the database goes before this object.
    void Watch(std::unique_ptr<DATABASE>& database, const std::string& path) {
        database = std::make_unique<DATABASE>(path.c_str(), *this);
    }
    // The permissions that the last new file began with.
    [[nodiscard]] mode_t FirstMode() const { return firstMode_; }
    // Makes every opening for writing fail so, as for a file that may only be read.
    void RefuseWriting(int error) { refused_ = error; }

    int Open(const char* path, int flags, mode_t mode) override {
        if ((flags & O_ACCMODE) == O_RDWR && refused_ != 0)
            return Failed(refused_);
        firstMode_ = (flags & O_CREAT) != 0 ? mode : firstMode_;
        const auto call = [&] { return System::Open(path, flags, mode); };
        const int file = (flags & O_CREAT) != 0 ? Meet(call) : call();
        open_ += file >= 0 ? 1 : 0;
        return file;
    }
    int Close(int file) override {
        --open_;
        return System::Close(file);
    }
    ssize_t ReadAt(int file, void* data, std::size_t size, off_t offset) override {
        const int after = IsOfReads() ? calls_++ - at_ : -1;
        const bool fails = at_ >= 0 && (after == 0 || (after > 0 && fault_ == Fault::NoReads));
        return fails ? Failed(error_) : System::ReadAt(file, data, (size + 1) / 2, offset);
    }
    ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
        order_ += 'w';
        if (!may('w'))
            return Failed(error_);
        if (calls_ != at_ || size < 2 || fault_ < Fault::HalfThenError || fault_ > Fault::Broken)
            return Meet([&] { return System::WriteAt(file, data, size, offset); });
        const ssize_t half = System::WriteAt(file, data, size / 2, offset);
        return Meet([half] { return half; });
    }
    int Truncate(int file, off_t size) override {
        return Meet([&] { return System::Truncate(file, size); });
    }
    int Sync(int file) override {
        return may('s') ? Meet([&] { return System::Sync(file); }, 's') : Failed(error_);
    }
    int SetOwner(int file, uid_t user, gid_t group) override {
        return Meet([&] { return System::SetOwner(file, user, group); });
    }
    int SetMode(int file, mode_t mode) override {
        return Meet([&] { return System::SetMode(file, mode); });
    }
    int Rename(const char* from, const char* to) override {
        return Meet([&] { return System::Rename(from, to); }, 'r');
    }
    int Remove(const char* path) override {
        return Meet([&] { return System::Remove(path); }, 'x');
    }

  private:
    static int Failed(int error) {
        errno = error;
        return -1;
    }
    [[nodiscard]] bool IsOfReads() const { return fault_ == Fault::NoRead || fault_ == Fault::NoReads; }
    template <class Call>
    auto Meet(const Call& call, char letter = 0) -> decltype(call()) {
        order_ += letter == 0 ? "" : std::string(1, letter);
        const int after = IsOfReads() ? -1 : calls_++ - at_;
        const int met = fault_ == Fault::Broken ? INT_MAX : 0;
        if (at_ < 0 || after < 0 || after > met)
            return call();
        if (fault_ == Fault::KilledAfter)
            call();
        if (fault_ >= Fault::KilledBefore)
            std::raise(SIGKILL);
        return fault_ == Fault::ShortWrite ? call() : Failed(fault_ == Fault::Interrupted ? EINTR : error_);
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
