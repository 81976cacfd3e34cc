#pragma once

#include <cerrno>
#include <functional>
#include <memory>
#include <string>
#include <utility>

#include "db/Database.h"

// Tells whether a data file of the running program has changes that a power cut would take. Used on the
// threads that use the file, one at a time.
class WatchedFiles : public FileOperations {
  public:
    // To be called while the program runs; the database goes before this object.
    void Watch(std::unique_ptr<DATABASE>& database, const std::string& path) {
        database = std::make_unique<DATABASE>(path.c_str(), *this);
    }
    // Whether all is on the disk, and was not before.
    [[nodiscard]] bool HaveSynced() { return changes_ == 0 && std::exchange(syncs_, 0) > 0; }

    ssize_t ReadAt(int file, void* data, std::size_t size, off_t offset) override {
        errno = EIO;
        return reads == 0 ? -1 : (--reads, FileOperations::ReadAt(file, data, size, offset));
    }
    ssize_t WriteAt(int file, const void* data, std::size_t size, off_t offset) override {
        ++changes_;
        return FileOperations::WriteAt(file, data, size, offset);
    }
    int Truncate(int file, off_t length) override {
        ++changes_;
        return FileOperations::Truncate(file, length);
    }
    int Sync(int file) override {
        if (beforeSync)
            beforeSync();
        if (failing) {
            errno = EIO;
            return -1;
        }
        changes_ = 0;
        ++syncs_;
        return FileOperations::Sync(file);
    }

    bool failing = false;
    unsigned reads = -1U; // before they fail
    std::function<void()> beforeSync;

  private:
    int changes_ = 0;
    int syncs_ = 0;
};
