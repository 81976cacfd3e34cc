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
    [[nodiscard]] std::unique_ptr<Process> Start() const {
        return std::make_unique<Process>(std::vector{File("quorvan")});
    }
    static std::string WindowOf(const Process& program) {
        return Output("xdotool search --onlyvisible --pid " + std::to_string(program.Id()) + " 2>/dev/null");
    }
    // Presses a key until the program ends. There is no window manager to give its window the focus.
    static bool EndsBy(const char* key, Process& program) {
        return WaitUntil([&] {
            Output("xdotool windowfocus " + WindowOf(program) + " 2>&1");
            Output(std::string("xdotool key ") + key + " 2>&1");
            return program.HasEnded();
        });
    }
    [[nodiscard]] bool IsHeldBy(const Process& program) const {
        return Read("Quorvan.lock").find("process: " + std::to_string(program.Id()) + "\n") !=
               std::string::npos;
    }

  private:
    Display display_;
};

TEST_F(BuiltProgram, StartsFromItsFolderAndEndsByItsMenuKey) {
    AddPortfolio("A");
    AddInvestment(MakeInvestment("A", "first"));
    AddInvestment(MakeInvestment("A", "second"));
    DATABASE(File("invest.db").c_str()).Delete(0);
    const auto program = Start();
    std::string window;
    ASSERT_TRUE(WaitUntil([&] {
        window = Output("xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null");
        return !window.empty() || program->HasEnded();
    }));
    ASSERT_FALSE(window.empty());
    EXPECT_NE(Output("xdotool getwindowgeometry " + window + " | grep Geometry").find("501x201"),
              std::string::npos);
    // What a task bar finds the desktop entry and the icon by.
    EXPECT_EQ(Output("xprop -id " + window + " WM_CLASS"), "WM_CLASS(STRING) = \"quorvan\", \"Quorvan\"");
    EXPECT_EQ(Output("xprop -id " + window + " -notype 32c ' = $0\\n' _NET_WM_ICON"), "_NET_WM_ICON = 16");
    EXPECT_TRUE(EndsBy("ctrl+q", *program));
    EXPECT_TRUE(program->EndedWell());

    EXPECT_EQ(RecordSlots("invest.db"), 1);
    EXPECT_EQ(Investments(), std::vector<std::string>{"A/second"});
    EXPECT_NE(Read("Quorvan.ini").find("ColumnWidth10=50\n"), std::string::npos);
}

TEST_F(BuiltProgram, IsRefusedAFolderUntilItsHolderHasGoneHoweverItWent) {
    const auto first = Start();
    ASSERT_TRUE(WaitUntil([&] { return !WindowOf(*first).empty() || first->HasEnded(); }));
    const std::string text = Read("Quorvan.lock");
    EXPECT_TRUE(IsHeldBy(*first)) << text;

    const auto second = Start();
    EXPECT_TRUE(EndsBy("Return", *second)); // the alert
    EXPECT_FALSE(second->EndedWell());
    EXPECT_FALSE(first->HasEnded());
    EXPECT_EQ(Read("Quorvan.lock"), text);

    kill(first->Id(), SIGKILL);
    EXPECT_TRUE(WaitUntil([&] { return first->HasEnded(); }));
    EXPECT_EQ(Read("Quorvan.lock"), text);
    const auto third = Start();
    EXPECT_TRUE(WaitUntil([&] { return IsHeldBy(*third) && !WindowOf(*third).empty(); }));
    EXPECT_FALSE(third->HasEnded());
}

TEST_F(BuiltProgram, GoesOnWhenAFileMustNotGrow) {
    Process program({"sh", "-c", "ulimit -f 0; exec " + File("quorvan")});
    ASSERT_TRUE(WaitUntil([&] { return !WindowOf(program).empty() || program.HasEnded(); }));
    EXPECT_FALSE(program.HasEnded());
}

TEST(Program, AnswersWithoutADisplay) {
    const std::pair<const char*, int> cases[] = {
        {"", 1}, {"--help", 0}, {"--version", 0}, {"--help me", 0}, {"nonsense", 2}};
    for (const auto& [arguments, status] : cases) {
        const std::string command = "env -u DISPLAY -u WAYLAND_DISPLAY -u QT_QPA_PLATFORM " QUORVAN_PROGRAM
                                    " " +
                                    std::string(arguments) + " >/dev/null 2>&1";
        const int result = std::system(command.c_str());
        EXPECT_TRUE(WIFEXITED(result) && WEXITSTATUS(result) == status) << arguments;
    }
}

} // namespace
