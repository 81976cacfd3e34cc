#pragma once

#include <array>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "Output.h"

// Programs that a test starts, and a display of the test's own for them.

// False when the condition does not come true within a minute.
inline bool WaitUntil(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (!condition()) {
        if (std::chrono::steady_clock::now() > end)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    return true;
}

// A child process, ended with the object.
class Process {
  public:
    // kept is a descriptor that the child keeps; -1 for none.
    explicit Process(const std::vector<std::string>& command, int kept = -1) : id_(fork()) {
        if (id_ != 0)
            return;
        prctl(PR_SET_PDEATHSIG, SIGTERM); // should the test crash
        std::vector<char*> arguments;
        arguments.reserve(command.size() + 1);
        for (const std::string& each : command)
            arguments.push_back(const_cast<char*>(each.c_str()));
        arguments.push_back(nullptr);
        if (kept >= 0)
            fcntl(kept, F_SETFD, 0);
        execvp(arguments[0], arguments.data());
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

// A program that serves others and says where, in one line, as soon as it does.
class Server {
  public:
    // The last word of the command is completed with the number of the descriptor for that line.
    explicit Server(std::vector<std::string> command) {
        std::array<int, 2> ends{};
        if (pipe2(ends.data(), O_CLOEXEC) != 0)
            throw std::runtime_error("no pipe");
        command.back() += std::to_string(ends[1]);
        process_ = std::make_unique<Process>(command, ends[1]);
        close(ends[1]);
        char letter = '\0';
        while (read(ends[0], &letter, 1) == 1 && letter != '\n')
            place_ += letter;
        close(ends[0]);
    }
    // Empty when it did not come to serve.
    [[nodiscard]] const std::string& Place() const { return place_; }

  private:
    std::unique_ptr<Process> process_;
    std::string place_;
};

// A display server that chooses a free display by itself; it is the test's display from then on. It does not
// start afresh when a client is the last to go, just as the next one comes.
class Display {
  public:
    Display()
        : server_({"Xvfb", "-screen", "0", "1024x768x24", "-nolisten", "tcp", "-noreset", "-displayfd", ""}) {
        setenv("DISPLAY", (":" + server_.Place()).c_str(), 1);
        setenv("QT_QPA_PLATFORM", "xcb", 1);
    }
    [[nodiscard]] bool IsReady() const { return !server_.Place().empty(); }

  private:
    Server server_;
};
