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

} // namespace
