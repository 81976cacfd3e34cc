// The built program, on a display server of the test's own.
#include <gtest/gtest.h>

#include <array>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <functional>
#include <thread>

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "DataFolder.h"

namespace {

using namespace std::chrono_literals;

bool WaitUntil(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + 60s;
    while (!condition()) {
        if (std::chrono::steady_clock::now() > end)
            return false;
        std::this_thread::sleep_for(20ms);
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

    bool HasEnded() { return ended_ || (ended_ = waitpid(id_, &status_, WNOHANG) == id_); }
    // Once it has ended: whether it did so by itself, with the result 0.
    [[nodiscard]] bool EndedWell() const { return WIFEXITED(status_) && WEXITSTATUS(status_) == 0; }

  private:
    pid_t id_;
    int status_ = 0;
    bool ended_ = false;
};

// Starts a display server that chooses a free display by itself, and makes that the test's display.
class Display {
  public:
    Display() {
        std::array<int, 2> ends{};
        if (pipe2(ends.data(), O_CLOEXEC) != 0)
            throw std::runtime_error("no pipe");
        server_ = std::make_unique<Process>(std::vector<std::string>{"Xvfb", "-displayfd",
                                                                     std::to_string(ends[1]), "-screen", "0",
                                                                     "1024x768x24", "-nolisten", "tcp"},
                                            ends[1]);
        close(ends[1]);
        std::array<char, 16> number{};
        std::size_t length = 0;
        while (length < number.size() - 1 && read(ends[0], &number[length], 1) == 1 && number[length] != '\n')
            ++length;
        close(ends[0]);
        number[length] = '\0';
        ready_ = length > 0;
        setenv("DISPLAY", (std::string(":") + number.data()).c_str(), 1);
        setenv("QT_QPA_PLATFORM", "xcb", 1);
    }
    [[nodiscard]] bool IsReady() const { return ready_; }

  private:
    std::unique_ptr<Process> server_;
    bool ready_ = false;
};

// The first line that the command prints.
std::string Output(const std::string& command) {
    FILE* pipe = popen(command.c_str(), "r");
    std::array<char, 64> line{};
    const bool got = fgets(line.data(), line.size(), pipe) != nullptr;
    pclose(pipe);
    const std::string text = got ? line.data() : "";
    return text.substr(0, text.find('\n'));
}

TEST(Program, StartsFromItsFolderAndEndsByItsMenuKey) {
    const DataFolder folder;
    std::filesystem::copy(QUORVAN_PROGRAM, folder.File("quorvan"));
    folder.AddPortfolio("A");
    folder.AddInvestment(MakeInvestment("A", "first"));
    folder.AddInvestment(MakeInvestment("A", "second"));
    DATABASE(folder.File("invest.db").c_str()).Delete(0);

    const Display display;
    ASSERT_TRUE(display.IsReady()) << "Xvfb did not start";
    Process program({folder.File("quorvan")});
    std::string window;
    ASSERT_TRUE(WaitUntil([&] {
        window = Output("xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null");
        return !window.empty() || program.HasEnded();
    }));
    ASSERT_FALSE(window.empty());
    EXPECT_NE(Output("xdotool getwindowgeometry " + window + " | grep Geometry").find("501x201"),
              std::string::npos);
    // There is no window manager to give it the focus.
    EXPECT_TRUE(WaitUntil([&] {
        Output("xdotool windowfocus " + window + " 2>&1");
        Output("xdotool key ctrl+q 2>&1");
        return program.HasEnded();
    }));
    EXPECT_TRUE(program.EndedWell());

    EXPECT_EQ(folder.RecordSlots("invest.db"), 1);
    EXPECT_EQ(folder.Investments(), std::vector<std::string>{"A/second"});
    EXPECT_NE(folder.Read("Quorvan.ini").find("ColumnWidth10=50\n"), std::string::npos);
}

} // namespace
