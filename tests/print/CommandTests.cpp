// quorvan-cli report, as a person runs it in a terminal without a display.
#include <gtest/gtest.h>

#include "DataFolder.h"
#include "Pdf.h"
#include "Shell.h"

namespace {

namespace fs = std::filesystem;

class ReportCommandTest : public testing::Test {
  protected:
    ReportCommandTest() {
        home_.AddPortfolio("My Fund");
        home_.AddInvestment(MakeInvestment("My Fund", "Timber", 3, 100));
    }
    // The command in an empty folder; `before` is shell text in front of it.
    static std::string Command(const std::string& arguments, const std::string& before = "",
                               const std::string& program = QUORVAN_CLI) {
        return "unset DISPLAY XDG_RUNTIME_DIR; " + before + "'" + program + "' report " + arguments;
    }
    // Whether the report was written, which it no longer is then.
    bool Written(const char* name = "out.pdf") {
        const bool whole =
            Output("pdftotext '" + place_.File(name) + "' - 2>&1").find("Timber") != std::string::npos;
        fs::remove(place_.File(name));
        return whole && fs::is_empty(place_.Path());
    }
    std::string DataFiles() const { return home_.Read("portfol.db") + home_.Read("invest.db"); }

    DataFolder home_;
    Shell place_;
};

TEST_F(ReportCommandTest, WritesTheReportAndChangesNoData) {
    const std::string before = DataFiles();
    EXPECT_EQ(place_.Run(Command("--home '" + home_.Path() + "' 'my fund' -o out.pdf")), 0)
        << place_.Errors();
    EXPECT_NE(Output("pdftotext '" + place_.File("out.pdf") + "' -").find("My Fund"), std::string::npos);
    EXPECT_TRUE(Written());
    EXPECT_EQ(place_.Errors(), "");
    EXPECT_EQ(DataFiles(), before);
}

TEST_F(ReportCommandTest, TakesItsOwnFolderOrQuorvanInThePersonsOwn) {
    const TemporaryFolder person;
    fs::create_directory_symlink(home_.Path(), person.File("Quorvan"));
    EXPECT_EQ(place_.Run(Command("'My Fund' -o out.pdf", "HOME='" + person.Path() + "' ")), 0)
        << place_.Errors();
    EXPECT_TRUE(Written());
    fs::copy_file(QUORVAN_CLI, home_.File("quorvan-cli"));
    EXPECT_EQ(place_.Run(Command("'My Fund' -o out.pdf", "HOME=/nowhere ", home_.File("quorvan-cli"))), 0)
        << place_.Errors();
    EXPECT_TRUE(Written());
}

TEST_F(ReportCommandTest, FailsWithOneClearSentenceAndLeavesFilesAlone) {
    const std::string home = "--home '" + home_.Path() + "' ";
    place_.Write("old.pdf", "old");
    const struct {
        std::string arguments;
        int status;
        const char* sentence;
        const char* before = "";
    } cases[] = {
        {home + "Nobody -o old.pdf", 1, "there is no portfolio \"Nobody\" in "},
        {home + "'' -o old.pdf", 1, "there is no portfolio \"\" in "},
        {"--home nowhere 'My Fund' -o old.pdf", 1, "nowhere/portfol.db cannot be opened"},
        {home + "'My Fund' -o missing/new.pdf", 1, "missing/new.pdf cannot be written: No such file"},
        {home + "'My Fund' -o .", 1, ". cannot be written: Is a directory"},
        {home + "'My Fund' -o old.pdf", 1, "old.pdf cannot be written: ", "ulimit -f 4; "},
        {home + "'My Fund'", 2, "--output"},
        {home + "-o old.pdf", 2, "PORTFOLIO"},
        {home + "'My Fund' -o old.pdf --page 2", 2, "--page"},
    };
    for (const auto& c : cases)
        EXPECT_TRUE(place_.Fails(Command(c.arguments, c.before), c.status, c.sentence));
    EXPECT_EQ(place_.Read("old.pdf"), "old");
    EXPECT_EQ(place_.Names(), std::vector<std::string>{"old.pdf"});
}

} // namespace
