// quorvan-cli chart, as a person runs it in a terminal without a display.
#include <gtest/gtest.h>

#include <sys/stat.h>

#include "DataFolder.h"
#include "Pdf.h"
#include "Shell.h"

namespace {

class ChartCommandTest : public testing::Test {
  protected:
    ChartCommandTest() {
        home_.AddPortfolio("My Fund");
        home_.AddInvestment(MakeInvestment("My Fund", "Timber & <Co>", 3, 100));
    }
    // The command in an empty folder; `before` is shell text in front of it.
    std::string Command(const std::string& arguments, const std::string& before = "") const {
        return "unset DISPLAY XDG_RUNTIME_DIR; " + before + "'" QUORVAN_CLI "' chart --home '" +
               home_.Path() + "' " + arguments;
    }
    mode_t ModeOf(const char* name) const {
        struct stat status {};
        return lstat(place_.File(name).c_str(), &status) == 0 ? status.st_mode : 0;
    }

    DataFolder home_;
    Shell place_;
};

TEST_F(ChartCommandTest, WritesEachKindOfPictureAndChangesNoData) {
    const std::string before = home_.Read("invest.db") + home_.Read("portfol.db");
    EXPECT_EQ(place_.Run(Command("'my fund' 2000 -o out.svg")), 0) << place_.Errors();
    const std::string svg = place_.Read("out.svg");
    EXPECT_NE(svg.find(">Timber &amp; &lt;Co&gt;: $300.00 100.00%</text>"), std::string::npos) << svg;
    EXPECT_EQ(place_.Run(Command("'My Fund' 'value OVER time' -o out.PDF")), 0) << place_.Errors();
    EXPECT_NE(Output("pdftotext '" + place_.File("out.PDF") + "' -").find("Value over Time"),
              std::string::npos);
    EXPECT_EQ(place_.Run(Command("'My Fund' 'Shares by Investment' -o out.png --scale 3")), 0)
        << place_.Errors();
    const std::string size("\0\0\x04\x1d", 4); // 351 pixels three times
    EXPECT_EQ(place_.Read("out.png").substr(16, 4), size);
    EXPECT_EQ(place_.Errors(), "");
    EXPECT_EQ(home_.Read("invest.db") + home_.Read("portfol.db"), before);
}

TEST_F(ChartCommandTest, PicturesAreAsPrivateAsThePersonWants) {
    EXPECT_EQ(place_.Run(Command("'My Fund' 2000 -o new.svg", "umask 077; ")), 0) << place_.Errors();
    EXPECT_EQ(ModeOf("new.svg"), S_IFREG | 0600U);
    place_.Write("kept.svg", "old");
    ASSERT_EQ(chmod(place_.File("kept.svg").c_str(), 0640), 0);
    EXPECT_EQ(place_.Run(Command("'My Fund' 2000 -o link.svg", "ln -s kept.svg link.svg; ")), 0)
        << place_.Errors();
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
    for (const auto& c : cases)
        EXPECT_TRUE(place_.Fails(Command(c.arguments, c.before), c.status, c.sentence));
    EXPECT_EQ(place_.Read("old.png"), "old");
    EXPECT_EQ(ModeOf("p") & S_IFMT, static_cast<mode_t>(S_IFIFO));
    EXPECT_EQ(place_.Names(), (std::vector<std::string>{"folder.png", "old.png", "p", "pipe.png"}));
}

} // namespace
