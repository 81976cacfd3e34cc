#pragma once

// Waiting beside a file descriptor that becomes readable when the caller shall stop (-1 for one that never
// does). A descriptor that is not open counts as readable: nobody could ever say stop with it.

enum class Waited { Ready, Stopped, NotYet };

inline constexpr int WithoutLimit = -1;

// Ready when `fd` has one of the poll events or an error, Stopped as soon as `stopFd` is readable, which
// counts more; NotYet when neither came about in the given time.
[[nodiscard]] Waited WaitUnlessStopped(int fd, short events, int stopFd, int milliseconds = WithoutLimit);

[[nodiscard]] bool IsStopped(int stopFd);
