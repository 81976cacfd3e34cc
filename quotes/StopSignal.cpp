#include "quotes/StopSignal.h"

#include <cerrno>
#include <poll.h>

bool WaitUnlessStopped(int fd, short events, int stopFd) {
    pollfd fds[] = {{fd, events, 0}, {stopFd, POLLIN, 0}};
    while (poll(fds, 2, -1) < 0 && errno == EINTR) {
    }
    return fds[1].revents == 0;
}

bool IsStopped(int stopFd) {
    pollfd stop{stopFd, POLLIN, 0};
    return poll(&stop, 1, 0) > 0;
}
