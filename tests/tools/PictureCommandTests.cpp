// quorvan-cli chart and report.
#include <array>

#include "CommandTest.h"
#include "DataFolder.h"

namespace {

class PictureCommandTest : public CommandTest {
  protected:
    PictureCommandTest() {
        home_.AddPortfolio("My Fund");
        home_.AddInvestment(MakeInvestment("My Fund", "Timber & <Co>", 3, 100));
    }

    DataFolder home_;
};

TEST_F(PictureCommandTest, WritesEachKindOfFileAndChangesNoData) {
    const std::string before = home_.Read("invest.db") + home_.Read("portfol.db");
    const std::array<const char*, 3> cases[] = {
        {"chart 'my fund' 2000 -o out.svg", "cat out.svg",
         ">Timber &amp; &lt;Co&gt;: $300.00 100.00%</text>"},
        {"chart 'My Fund' 'value OVER time' -o out.PDF", "pdftotext out.PDF -", "Value over Time"},
        {"chart 'My Fund' 'Shares by Investment' -o out.png --scale 3", "od -An -tu1 -j16 -N4 out.png",
         " 0   0   4  29"}, // 351 pixels three times
        {"report 'my fund' -o out.pdf", "pdftotext out.pdf - | tr '\\n' ' '", "My Fund"},
    };
    for (const auto& [arguments, reader, found] : cases) {
        EXPECT_EQ(Printed("quorvan-cli " + (arguments + (" --home '" + home_.Path() + "'"))), "");
        EXPECT_TRUE(Works(reader, found));
        EXPECT_EQ(Printed("rm out.*; ls"), "built\n");
    }
    EXPECT_EQ(home_.Read("invest.db") + home_.Read("portfol.db"), before);
}

TEST_F(PictureCommandTest, PicturesAreAsPrivateAsThePersonWants) {
    // Without --home the folder is the program's own, or Quorvan in the person's.
    ASSERT_TRUE(Works("ln -s '" + home_.Path() + "' Quorvan; cp \"$(command -v quorvan-cli)\" Quorvan"));
    EXPECT_TRUE(Works("umask 077; HOME=$PWD quorvan-cli chart 'My Fund' 2000 -o new.svg"));
    EXPECT_TRUE(Works("echo >kept.svg; chmod 640 kept.svg; ln -s kept.svg link.svg; "
                      "HOME=/nowhere Quorvan/quorvan-cli chart 'My Fund' 2000 -o link.svg"));
    EXPECT_TRUE(Works("HOME=$PWD quorvan-cli report 'My Fund' -o out.pdf; pdftotext out.pdf -", "My Fund"));
    EXPECT_EQ(Printed("stat -c '%n %A' *.svg; cmp kept.svg new.svg"),
              "kept.svg -rw-r-----\nlink.svg lrwxrwxrwx\nnew.svg -rw-------\n");
}

} // namespace
