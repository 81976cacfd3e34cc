#pragma once

#include <chrono>
#include <csignal>
#include <functional>
#include <thread>

#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "Shell.h"

// Programs that a test starts, and a display of the test's own for them.

// False when the condition does not come true within a minute.
inline bool WaitUntil(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    bool is = condition();
    for (; !is && std::chrono::steady_clock::now() < end; is = condition())
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    return is;
}

// What a shell runs, as a child process that ends with the object. A single program is to take the shell's
// place, by exec.
class Process {
  public:
    explicit Process(const std::string& command) : id_(fork()) {
        if (id_ != 0)
            return;
        prctl(PR_SET_PDEATHSIG, SIGTERM); // should the test crash
        execlp("sh", "sh", "-c", command.c_str(), nullptr);
        _exit(127);
    }
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;
    ~Process() {
        if (!HasEnded()) {
            kill(id_, SIGTERM);
            waitpid(id_, &status_, 0);
        }
    }

    [[nodiscard]] pid_t Id() const { return id_; }
    bool HasEnded() { return ended_ || (ended_ = waitpid(id_, &status_, WNOHANG) == id_); }
    // Once it has ended: whether it did so by itself, with the result 0.
    [[nodiscard]] bool EndedWell() const { return WIFEXITED(status_) && WEXITSTATUS(status_) == 0; }

  private:
    pid_t id_;
    int status_ = 0;
    bool ended_ = false;
};

// A display server that chooses a free display by itself; it is the test's display from then on. It does not
// start afresh when a client is the last to go, just as the next one comes.
class Display {
  public:
    Display() {
        if (!WaitUntil([this] { return folder_.Read("number").ends_with('\n'); }))
            throw std::runtime_error("Xvfb did not start");
        setenv("DISPLAY", (":" + Output("cat " + folder_.File("number"))).c_str(), 1);
        setenv("QT_QPA_PLATFORM", "xcb", 1);
    }

  private:
    const TemporaryFolder folder_;
    Process server_{"exec Xvfb -screen 0 1024x768x24 -nolisten tcp -noreset -displayfd 3 3>" +
                    folder_.File("number")};
};
