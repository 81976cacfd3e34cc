#pragma once

#include <cerrno>
#include <poll.h>

// Waiting beside a file descriptor that becomes readable when the caller shall stop (-1 for one that never
// does). A descriptor that is not open counts as readable: nobody could ever say stop with it.

// Waits until `fd` has one of the poll events or an error; false as soon as `stopFd` is readable, which
// counts more.
[[nodiscard]] inline bool WaitUnlessStopped(int fd, short events, int stopFd) {
    pollfd fds[] = {{fd, events, 0}, {stopFd, POLLIN, 0}};
    while (poll(fds, 2, -1) < 0 && errno == EINTR) {
    }
    return fds[1].revents == 0;
}

[[nodiscard]] inline bool IsStopped(int stopFd) {
    pollfd stop{stopFd, POLLIN, 0};
    return stopFd >= 0 && poll(&stop, 1, 0) > 0;
}
