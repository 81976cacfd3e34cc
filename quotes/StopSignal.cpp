#include "quotes/StopSignal.h"

#include <cerrno>
#include <poll.h>

Waited WaitUnlessStopped(int fd, short events, int stopFd, int milliseconds) {
    pollfd fds[] = {{fd, events, 0}, {stopFd, POLLIN, 0}};
    while (poll(fds, 2, milliseconds) < 0 && errno == EINTR) {
    }
    if (fds[1].revents != 0)
        return Waited::Stopped;
    return fds[0].revents != 0 ? Waited::Ready : Waited::NotYet;
}

bool IsStopped(int stopFd) {
    pollfd stop{stopFd, POLLIN, 0};
    return stopFd >= 0 && poll(&stop, 1, 0) > 0;
}
