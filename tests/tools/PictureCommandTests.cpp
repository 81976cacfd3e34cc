// quorvan-cli chart and report.
#include <array>

#include "CommandTest.h"

namespace {

class PictureCommandTest : public CommandTest {};

TEST_F(PictureCommandTest, WritesEachKindOfFileAsPrivateAsWantedAndChangesNoData) {
    ASSERT_TRUE(Works(Setup("--sample", "Quorvan")));
    const std::string before = State();
    const std::array<std::string, 3> cases[] = {
        {"chart --home Quorvan 'my retirement fund' 2000 -o out.svg",
         "cat out.svg; grep '<desc>Chart of My Retirement Fund' out.svg",
         ">Birch &amp; Sons: $4026.75 2.41%</text>"},
        {"chart --home Quorvan 'My Retirement Fund' 'value OVER time' -o out.PDF", "pdftotext out.PDF -",
         "Value over Time"},
        {"chart --home Quorvan 'My Retirement Fund' 'Shares by Investment' -o out.png --scale 3",
         "od -An -tu1 -j16 -N4 out.png", " 0   0   4  29"}, // 351 pixels three times
    };
    for (const auto& [arguments, reader, found] : cases) {
        EXPECT_EQ(Printed("quorvan-cli " + arguments), "");
        EXPECT_TRUE(Works(reader + "; rm out.*", found));
    }
    EXPECT_EQ(State(), before);
    // Without --home the folder is the program's own, or Quorvan in the person's.
    const std::string chart = "quorvan-cli chart 'My Retirement Fund' 2000 -o ";
    EXPECT_TRUE(Works("umask 077; HOME=$PWD " + chart + "new.svg"));
    EXPECT_TRUE(Works("echo >kept.svg; chmod 640 kept.svg; ln -s kept.svg link.svg; HOME=/nowhere Quorvan/" +
                      chart + "link.svg"));
    EXPECT_TRUE(
        Works("HOME=$PWD quorvan-cli report 'my retirement fund' -o a.pdf; pdftotext a.pdf -", "My Ret"));
    EXPECT_EQ(Printed("stat -c '%n %A' *.svg; cmp kept.svg new.svg"),
              "kept.svg -rw-r-----\nlink.svg lrwxrwxrwx\nnew.svg -rw-------\n");
}

} // namespace
