#pragma once

#include <functional>

#include <sys/wait.h>
#include <unistd.h>

// The result (0 to 255) of work done in a process of its own; -1 when a signal ended it.
inline int ResultInChild(const std::function<int()>& work) {
    const pid_t child = fork();
    if (child == 0)
        _exit(work());
    int status = 0;
    waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// The same, as an ordinary user also where the tests run as root, whom no permission keeps out.
inline int ResultAsOrdinaryUser(const std::function<int()>& work) {
    return ResultInChild([&] {
        constexpr int nobody = 65534;
        const bool ordinary = getuid() != 0 || (setgid(nobody) == 0 && setuid(nobody) == 0);
        return ordinary ? work() : 255;
    });
}
