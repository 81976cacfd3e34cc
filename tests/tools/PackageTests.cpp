// The archive, as somebody who has nothing else finds it.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>

#include "Session.h"
#include "TemporaryFolder.h"

namespace {

namespace fs = std::filesystem;

class PackageTest : public testing::Test {
  protected:
    // The commands run one after the other in the test's folder.
    bool Shell(const std::string& commands) const {
        return std::system(("cd '" + folder_.Path() + "' && " + commands).c_str()) == 0;
    }

    TemporaryFolder folder_;
};

TEST_F(PackageTest, UnpacksToAFolderThatRuns) {
    ASSERT_TRUE(Shell(QUORVAN_PACK " -B packed >said && tar xzf packed/*.tar.gz && mv Quorvan-* Quorvan"));
    for (const char* name : {"Quorvan/quorvan", "Quorvan/bin/quorvan-cli", "Quorvan/help/Quorvan.html",
                             "Quorvan/README.txt", "Quorvan/share/man/man1/quorvan.1"})
        EXPECT_TRUE(folder_.Has(name)) << name;
    // Unpacked over a folder in use it must not take the place of anything the person has.
    for (const char* name : {"portfol.db", "invest.db", "misc.db", "Quorvan.ini", "Quorvan.cfg"})
        EXPECT_FALSE(folder_.Has(std::string("Quorvan/") + name)) << name;
    ASSERT_TRUE(Shell("Quorvan/bin/quorvan-cli setup home --sample >said && cmp home/quorvan Quorvan/quorvan "
                      "&& cd Quorvan && bin/quorvan-cli setup . >said && [ -f invest.db ]"));

    const Display display;
    ASSERT_TRUE(display.IsReady()) << "Xvfb did not start";
    for (const char* program : {"home/quorvan", "Quorvan/quorvan"}) {
        Process running({folder_.File(program)});
        EXPECT_TRUE(WaitUntil([&] {
            return running.HasEnded() ||
                   !Output("xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null").empty();
        }));
        EXPECT_FALSE(running.HasEnded()) << program;
    }
}

TEST_F(PackageTest, ManPagesAreInOrder) {
    for (const auto& page : fs::directory_iterator(QUORVAN_MAN_PAGES)) {
        EXPECT_TRUE(Shell("LC_ALL=C.UTF-8 MANROFFSEQ= MANWIDTH=80 man --warnings -E UTF-8 -l -Tutf8 -Z '" +
                          page.path().string() + "' >page 2>said"));
        EXPECT_EQ(folder_.Read("said"), "") << page.path();
        EXPECT_NE(folder_.Read("page"), "");
    }
}

} // namespace
