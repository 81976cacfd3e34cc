// quorvan-cli chart, as a person runs it in a terminal without a display.
#include <gtest/gtest.h>

#include <cstdlib>
#include <sys/stat.h>
#include <sys/wait.h>

#include "DataFolder.h"
#include "Pdf.h"

namespace {

namespace fs = std::filesystem;

class ChartCommandTest : public testing::Test {
  protected:
    ChartCommandTest() {
        home_.AddPortfolio("My Fund");
        home_.AddInvestment(MakeInvestment("My Fund", "Timber & <Co>", 3, 100));
    }
    // Runs it in an empty folder; `before` is shell text in front of it.
    int Run(const std::string& arguments, const std::string& before = "") {
        const std::string command = "cd '" + place_.Path() + "' && unset DISPLAY XDG_RUNTIME_DIR; " + before +
                                    "'" QUORVAN_CLI "' chart --home '" + home_.Path() + "' " + arguments +
                                    " >/dev/null 2>'" + home_.File("err") + "'";
        const int status = std::system(command.c_str());
        errors_ = home_.Read("err");
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    mode_t ModeOf(const char* name) const {
        struct stat status {};
        return lstat(place_.File(name).c_str(), &status) == 0 ? status.st_mode : 0;
    }

    DataFolder home_;
    TemporaryFolder place_;
    std::string errors_;
};

TEST_F(ChartCommandTest, WritesEachKindOfPictureAndChangesNoData) {
    const std::string before = home_.Read("invest.db") + home_.Read("portfol.db");
    EXPECT_EQ(Run("'my fund' 2000 -o out.svg"), 0) << errors_;
    const std::string svg = place_.Read("out.svg");
    EXPECT_NE(svg.find(">Timber &amp; &lt;Co&gt;: $300.00 100.00%</text>"), std::string::npos) << svg;
    EXPECT_EQ(Run("'My Fund' 'value OVER time' -o out.PDF"), 0) << errors_;
    EXPECT_NE(Output("pdftotext '" + place_.File("out.PDF") + "' -").find("Value over Time"),
              std::string::npos);
    EXPECT_EQ(Run("'My Fund' 'Shares by Investment' -o out.png --scale 3"), 0) << errors_;
    const std::string size("\0\0\x04\x1d", 4); // 351 pixels three times
    EXPECT_EQ(place_.Read("out.png").substr(16, 4), size);
    EXPECT_EQ(errors_, "");
    EXPECT_EQ(home_.Read("invest.db") + home_.Read("portfol.db"), before);
}

TEST_F(ChartCommandTest, PicturesAreAsPrivateAsThePersonWants) {
    EXPECT_EQ(Run("'My Fund' 2000 -o new.svg", "umask 077; "), 0) << errors_;
    EXPECT_EQ(ModeOf("new.svg"), S_IFREG | 0600U);
    place_.Write("kept.svg", "old");
    ASSERT_EQ(chmod(place_.File("kept.svg").c_str(), 0640), 0);
    EXPECT_EQ(Run("'My Fund' 2000 -o link.svg", "ln -s kept.svg link.svg; "), 0) << errors_;
    EXPECT_EQ(ModeOf("kept.svg"), S_IFREG | 0640U);
    EXPECT_EQ(ModeOf("link.svg") & S_IFMT, static_cast<mode_t>(S_IFLNK));
    EXPECT_EQ(place_.Read("kept.svg"), place_.Read("new.svg"));
}

TEST_F(ChartCommandTest, FailsWithOneClearSentenceAndLeavesFilesAlone) {
    place_.Write("old.png", "old");
    const struct {
        const char* arguments;
        int status;
        const char* sentence;
        const char* before = "";
    } cases[] = {
        {"Nobody 2000 -o old.png", 1, "there is no portfolio \"Nobody\" in "},
        {"'My Fund' 2008 -o old.png", 2, "there is no chart '2008'; there are 2000 to 2007"},
        {"'My Fund' Value -o old.png", 2, "there is no chart 'Value'"},
        {"'My Fund' 2000 -o old.gif", 2, "must end with .png, .svg or .pdf"},
        {"'My Fund' 2000 -o old.png --scale nan", 2, "the scale must be a number"},
        {"'My Fund' 2000 -o old.png --scale 17", 2, "--scale"},
        {"'My Fund' 2000", 2, "--output"},
        {"'My Fund' 2000 -o missing/new.png", 1, "missing/new.png cannot be written: No such file"},
        {"'My Fund' 2000 -o old.png", 1, "old.png cannot be written: ", "ulimit -f 4; trap '' XFSZ; "},
        {"'My Fund' 2000 -o folder.png", 1, "cannot be written: Is a directory", "mkdir folder.png; "},
        {"'My Fund' 2000 -o pipe.png", 1, "pipe.png cannot be written: ", "mkfifo p; ln -s p pipe.png; "},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(Run(c.arguments, c.before), c.status) << c.arguments;
        EXPECT_NE(errors_.find(c.sentence), std::string::npos) << errors_;
    }
    EXPECT_EQ(place_.Read("old.png"), "old");
    EXPECT_EQ(ModeOf("p") & S_IFMT, static_cast<mode_t>(S_IFIFO));
    EXPECT_EQ(std::distance(fs::directory_iterator(place_.Path()), {}), 4); // and no temporary
}

} // namespace
