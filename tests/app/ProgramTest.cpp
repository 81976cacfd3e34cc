// The built program, on a display server of the test's own.
#include "DataFolder.h"
#include "Session.h"

namespace {

class BuiltProgram : public testing::Test, protected DataFolder {
  protected:
    BuiltProgram() { std::filesystem::copy(QUORVAN_PROGRAM, File("quorvan")); }

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

    const std::string start_ = "exec " + File("quorvan");

  private:
    const Display display_;
};

TEST_F(BuiltProgram, HasItsFolderToItselfUntilItHasGoneHoweverItWent) {
    Process killed(start_);
    ASSERT_TRUE(ShowsAWindow(killed));
    const std::string left = Read("Quorvan.lock");
    kill(killed.Id(), SIGKILL);
    EXPECT_TRUE(WaitUntil([&] { return killed.HasEnded(); }));
    EXPECT_EQ(Read("Quorvan.lock"), left);

    Process first(start_);
    ASSERT_TRUE(ShowsAWindow(first));
    const std::string lock = Read("Quorvan.lock");
    EXPECT_NE(lock.find("process: " + std::to_string(first.Id()) + "\n"), std::string::npos) << lock;
    Process second(start_);
    EXPECT_TRUE(EndsBy("Return", second)); // the alert
    EXPECT_FALSE(second.EndedWell() || first.HasEnded());
    EXPECT_EQ(Read("Quorvan.lock"), lock);

    // The latter two are what a task bar finds the desktop entry and the icon by.
    const std::string window = WindowOf(first);
    EXPECT_EQ(Output("xdotool getwindowgeometry " + window + " | grep Geometry; xprop -id " + window +
                     " WM_CLASS; xprop -id " + window + " -notype 32c ' = $0\\n' _NET_WM_ICON"),
              "  Geometry: 501x201\nWM_CLASS(STRING) = \"quorvan\", \"Quorvan\"\n_NET_WM_ICON = 16");
    EXPECT_TRUE(EndsBy("ctrl+q", first) && first.EndedWell());
    EXPECT_FALSE(Has("Quorvan.lock"));
}

TEST_F(BuiltProgram, GoesOnWhenAFileMustNotGrow) {
    Process program("ulimit -f 0; " + start_);
    EXPECT_TRUE(ShowsAWindow(program));
}

TEST(Program, AnswersWithoutADisplay) {
    Shell shell;
    const std::string start = "env -u DISPLAY -u WAYLAND_DISPLAY -u QT_QPA_PLATFORM " QUORVAN_PROGRAM " ";
    for (const auto& [arguments, status] :
         {std::pair{"", 1}, {"--help", 0}, {"--version", 0}, {"--help me", 0}, {"nonsense", 2}})
        EXPECT_EQ(shell.Run(start + arguments), status) << arguments;
}

} // namespace
