#include "app/model/ReadOnlyFiles.h"

#include <cerrno>
#include <fcntl.h>

namespace {

int Refuse() {
    errno = EROFS;
    return -1;
}

} // namespace

int ReadOnlyFiles::Open(const char* path, int flags, mode_t mode) {
    return (flags & O_ACCMODE) == O_RDONLY ? FileOperations::Open(path, flags, mode) : Refuse();
}

int ReadOnlyFiles::Rename(const char* /*from*/, const char* /*to*/) {
    return Refuse();
}

int ReadOnlyFiles::Remove(const char* /*path*/) {
    return Refuse();
}
