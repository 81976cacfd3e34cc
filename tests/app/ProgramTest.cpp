// The built program, on a display server of the test's own.
#include <gtest/gtest.h>

#include <filesystem>

#include "DataFolder.h"
#include "Session.h"

namespace {

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
    // What a task bar finds the desktop entry and the icon by.
    EXPECT_EQ(Output("xprop -id " + window + " WM_CLASS"), "WM_CLASS(STRING) = \"quorvan\", \"Quorvan\"");
    EXPECT_EQ(Output("xprop -id " + window + " -notype 32c ' = $0\\n' _NET_WM_ICON"), "_NET_WM_ICON = 16");
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

std::string WindowOf(const Process& program) {
    return Output("xdotool search --onlyvisible --pid " + std::to_string(program.Id()) + " 2>/dev/null");
}

TEST(Program, IsRefusedAFolderUntilItsHolderHasGoneHoweverItWent) {
    const DataFolder folder;
    std::filesystem::copy(QUORVAN_PROGRAM, folder.File("quorvan"));
    const Display display;
    ASSERT_TRUE(display.IsReady()) << "Xvfb did not start";
    auto first = std::make_unique<Process>(std::vector{folder.File("quorvan")});
    ASSERT_TRUE(WaitUntil([&] { return !WindowOf(*first).empty() || first->HasEnded(); }));
    const std::string text = folder.Read("Quorvan.lock");
    EXPECT_NE(text.find("process: " + std::to_string(first->Id()) + "\n"), std::string::npos);

    Process second({folder.File("quorvan")});
    EXPECT_TRUE(WaitUntil([&] {
        Output("xdotool windowfocus " + WindowOf(second) + " 2>&1"); // the alert
        Output("xdotool key Return 2>&1");
        return second.HasEnded();
    }));
    EXPECT_FALSE(second.EndedWell());
    EXPECT_FALSE(first->HasEnded());
    EXPECT_EQ(folder.Read("Quorvan.lock"), text);

    kill(first->Id(), SIGKILL);
    EXPECT_TRUE(WaitUntil([&] { return first->HasEnded(); }));
    EXPECT_EQ(folder.Read("Quorvan.lock"), text);
    Process third({folder.File("quorvan")});
    EXPECT_TRUE(WaitUntil([&] {
        return folder.Read("Quorvan.lock").find("process: " + std::to_string(third.Id()) + "\n") !=
                   std::string::npos &&
               !WindowOf(third).empty();
    }));
    EXPECT_FALSE(third.HasEnded());
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
