// The built program, on a display server of the test's own.
#include <gtest/gtest.h>

#include <filesystem>

#include "DataFolder.h"
#include "Session.h"

namespace {

class BuiltProgram : public testing::Test, protected DataFolder {
  protected:
    void SetUp() override {
        std::filesystem::copy(QUORVAN_PROGRAM, File("quorvan"));
        ASSERT_TRUE(display_.IsReady()) << "Xvfb did not start";
    }
    [[nodiscard]] std::unique_ptr<Process> Start(const std::string& shell = "") const {
        return std::make_unique<Process>(
            std::vector<std::string>{"sh", "-c", shell + "exec " + File("quorvan")});
    }
    static std::string WindowOf(const Process& program) {
        return Output("xdotool search --onlyvisible --pid " + std::to_string(program.Id()) + " 2>/dev/null");
    }
    static bool ShowsAWindow(Process& program) {
        return WaitUntil([&] { return !WindowOf(program).empty() || program.HasEnded(); }) &&
               !program.HasEnded();
    }
    // Presses a key until the program ends. There is no window manager to give its window the focus.
    static bool EndsBy(const char* key, Process& program) {
        return WaitUntil([&] {
            Output("xdotool windowfocus " + WindowOf(program) + " key " + key + " 2>&1");
            return program.HasEnded();
        });
    }

  private:
    Display display_;
};

TEST_F(BuiltProgram, HasItsFolderToItselfUntilItHasGoneHoweverItWent) {
    const auto killed = Start();
    ASSERT_TRUE(ShowsAWindow(*killed));
    const std::string left = Read("Quorvan.lock");
    kill(killed->Id(), SIGKILL);
    EXPECT_TRUE(WaitUntil([&] { return killed->HasEnded(); }));
    EXPECT_EQ(Read("Quorvan.lock"), left);

    const auto first = Start();
    ASSERT_TRUE(ShowsAWindow(*first));
    const std::string lock = Read("Quorvan.lock");
    EXPECT_NE(lock.find("process: " + std::to_string(first->Id()) + "\n"), std::string::npos) << lock;
    const auto second = Start();
    EXPECT_TRUE(EndsBy("Return", *second)); // the alert
    EXPECT_FALSE(second->EndedWell());
    EXPECT_FALSE(first->HasEnded());
    EXPECT_EQ(Read("Quorvan.lock"), lock);

    const std::string window = WindowOf(*first);
    EXPECT_EQ(Output("xdotool getwindowgeometry " + window + " | grep Geometry"), "  Geometry: 501x201");
    // What a task bar finds the desktop entry and the icon by.
    EXPECT_EQ(Output("xprop -id " + window + " WM_CLASS"), "WM_CLASS(STRING) = \"quorvan\", \"Quorvan\"");
    EXPECT_EQ(Output("xprop -id " + window + " -notype 32c ' = $0\\n' _NET_WM_ICON"), "_NET_WM_ICON = 16");
    EXPECT_TRUE(EndsBy("ctrl+q", *first) && first->EndedWell());
    EXPECT_FALSE(Has("Quorvan.lock"));
}

TEST_F(BuiltProgram, GoesOnWhenAFileMustNotGrow) {
    EXPECT_TRUE(ShowsAWindow(*Start("ulimit -f 0; ")));
}

TEST(Program, AnswersWithoutADisplay) {
    const std::pair<const char*, int> cases[] = {
        {"", 1}, {"--help", 0}, {"--version", 0}, {"--help me", 0}, {"nonsense", 2}};
    for (const auto& [arguments, status] : cases) {
        const std::string command = std::string("env -u DISPLAY -u WAYLAND_DISPLAY -u QT_QPA_PLATFORM ") +
                                    QUORVAN_PROGRAM + " " + arguments + " >/dev/null 2>&1";
        const int result = std::system(command.c_str());
        EXPECT_TRUE(WIFEXITED(result) && WEXITSTATUS(result) == status) << arguments;
    }
}

} // namespace
