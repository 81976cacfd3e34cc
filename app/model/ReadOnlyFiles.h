#pragma once

#include "db/File.h"

// The system's file operations for looking only: what would make or change a file fails with EROFS. A
// DATABASE opens its file for reading then. It holds no state.
class ReadOnlyFiles : public FileOperations {
  public:
    int Open(const char* path, int flags, mode_t mode) override;
    int Rename(const char* from, const char* to) override;
    int Remove(const char* path) override;
};
