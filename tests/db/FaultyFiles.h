#pragma once

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <functional>
#include <memory>
#include <string>
#include <utility>

#include <fcntl.h>

#include "db/Database.h"

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

// The system's files, of which one call meets a fault. A read gives half. At the end no file may be open.
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
    bool Disarm() { return std::exchange(at_, -1) < calls_; }
    // A letter for each change: new file, write, truncate, sync, owner, mode, rename, x to remove, - if
    // forbidden.
    [[nodiscard]] const std::string& Order() const { return order_; }
    // Whether changes reached the disk since this was last asked, and all of them.
    [[nodiscard]] bool HaveSynced() { return std::exchange(order_, "").ends_with('s'); }
    // Called before each change, which fails when it says no.
    std::function<bool(char)> may = [](char) { return true; };
    // Opens a file of a running program anew; the database goes before this object.
    void Watch(std::unique_ptr<DATABASE>& database, const std::string& path) {
        database = std::make_unique<DATABASE>(path.c_str(), *this);
    }
    mode_t firstMode = 0; // of the last new file
    int writingError = 0; // of every opening for writing, as for a file that may only be read

    int Open(const char* path, int flags, mode_t mode) override {
        if ((flags & O_ACCMODE) == O_RDWR && writingError != 0)
            return Failed(writingError);
        const bool isNew = (flags & O_CREAT) != 0;
        firstMode = isNew ? mode : firstMode;
        const int file =
            isNew ? Meet('n', &System::Open, path, flags, mode) : system_.Open(path, flags, mode);
        open_ += file >= 0 ? 1 : 0;
        return file;
    }
    int Close(int file) override {
        --open_;
        return system_.Close(file);
    }
    ssize_t ReadAt(int file, void* data, std::size_t size, off_t offset) override {
        return Meets(true) ? Failed(error_) : system_.ReadAt(file, data, (size + 1) / 2, offset);
    }
    ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
        const bool half =
            calls_ == at_ && size > 1 && fault_ >= Fault::HalfThenError && fault_ <= Fault::Broken;
        if (half)
            system_.WriteAt(file, data, size / 2, offset);
        return Meet('w', &System::WriteAt, file, data, half ? size / 2 : size, offset);
    }
    int Truncate(int file, off_t size) override { return Meet('t', &System::Truncate, file, size); }
    int Sync(int file) override { return Meet('s', &System::Sync, file); }
    int SetOwner(int file, uid_t user, gid_t group) override {
        return Meet('o', &System::SetOwner, file, user, group);
    }
    int SetMode(int file, mode_t mode) override { return Meet('m', &System::SetMode, file, mode); }
    int Rename(const char* from, const char* to) override { return Meet('r', &System::Rename, from, to); }
    int Remove(const char* path) override { return Meet('x', &System::Remove, path); }

  private:
    static int Failed(int error) {
        errno = error;
        return -1;
    }
    // Counts a call of the kind that the fault is about.
    bool Meets(bool read) {
        if (read != (fault_ == Fault::NoRead || fault_ == Fault::NoReads))
            return false;
        const bool lasts = fault_ == Fault::Broken || fault_ == Fault::NoReads;
        const int after = calls_++ - at_;
        return at_ >= 0 && (after == 0 || (lasts && after > 0));
    }
    template <class Result, class... Parameters>
    Result Meet(char letter, Result (System::*call)(Parameters...), Parameters... parameters) {
        const bool allowed = may(letter);
        order_ += allowed ? letter : '-';
        const bool meets = allowed && Meets(false);
        if (!allowed || (meets && fault_ < Fault::KilledBefore && fault_ != Fault::ShortWrite))
            return Failed(fault_ == Fault::Interrupted ? EINTR : error_);
        if (meets && fault_ == Fault::KilledBefore)
            std::raise(SIGKILL);
        const Result result = (system_.*call)(parameters...);
        if (meets && fault_ == Fault::KilledAfter)
            std::raise(SIGKILL);
        return result;
    }

    System system_;
    Fault fault_ = Fault::Error;
    int at_ = -1;
    int error_ = ENOSPC;
    int calls_ = 0;
    int open_ = 0;
    std::string order_;
};
