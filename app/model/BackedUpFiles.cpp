#include "app/model/BackedUpFiles.h"

#include <algorithm>
#include <fcntl.h>

#include "app/model/DailyBackup.h"

int BackedUpFiles::Open(const char* path, int flags, mode_t mode) {
    const int descriptor = FileOperations::Open(path, flags, mode);
    if (descriptor >= 0 && (flags & O_ACCMODE) == O_RDWR && (flags & O_CREAT) == 0)
        dataFiles_.push_back(descriptor);
    return descriptor;
}

int BackedUpFiles::Close(int descriptor) {
    std::erase(dataFiles_, descriptor);
    return FileOperations::Close(descriptor);
}

ssize_t BackedUpFiles::WriteAt(int descriptor, const void* data, std::size_t size, off_t offset) {
    BeforeChange(descriptor);
    return FileOperations::WriteAt(descriptor, data, size, offset);
}

int BackedUpFiles::Truncate(int descriptor, off_t length) {
    BeforeChange(descriptor);
    return FileOperations::Truncate(descriptor, length);
}

void BackedUpFiles::BeforeChange(int descriptor) {
    if (std::find(dataFiles_.begin(), dataFiles_.end(), descriptor) != dataFiles_.end())
        static_cast<void>(backup_.Keep());
}
