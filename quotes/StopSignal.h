#pragma once

// Waiting beside a file descriptor that becomes readable when the caller shall stop (-1 for one that never
// does). A descriptor that is not open counts as readable: nobody could ever say stop with it.

// True when `fd` has one of the poll events or an error, false as soon as `stopFd` is readable.
[[nodiscard]] bool WaitUnlessStopped(int fd, short events, int stopFd);

[[nodiscard]] bool IsStopped(int stopFd);
