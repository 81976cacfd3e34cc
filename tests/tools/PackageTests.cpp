// The archive, as somebody who has nothing else finds it.
#include "Session.h"
#include "Shell.h"

namespace {

TEST(PackageTest, UnpacksToAFolderThatRuns) {
    Shell folder;
    ASSERT_EQ(folder.Run(QUORVAN_PACK " -B packed && tar xzf packed/*.tar.gz && mv Quorvan-* Quorvan"), 0);
    ASSERT_EQ(folder.Run("cd Quorvan; ls quorvan bin/quorvan-cli help/Quorvan.html README.txt "
                         "share/man/man1/quorvan.1"),
              0);
    // Unpacked over a folder in use it must not take the place of anything the person has.
    ASSERT_EQ(folder.Run("find Quorvan -name '*.db' -o -name Quorvan.ini -o -name Quorvan.cfg"), 0);
    EXPECT_EQ(folder.Output(), "");
    ASSERT_EQ(folder.Run("Quorvan/bin/quorvan-cli setup home --sample && cmp home/quorvan Quorvan/quorvan && "
                         "cd Quorvan && bin/quorvan-cli setup . && [ -f invest.db ]"),
              0);

    const Display display;
    ASSERT_TRUE(display.IsReady()) << "Xvfb did not start";
    for (const char* program : {"home/quorvan", "Quorvan/quorvan"}) {
        Process running({folder.File(program)});
        EXPECT_TRUE(WaitUntil([&] {
            return running.HasEnded() ||
                   !Output("xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null").empty();
        }));
        EXPECT_FALSE(running.HasEnded()) << program;
    }
}

TEST(PackageTest, ManPagesAreInOrder) {
    Shell folder;
    for (const auto& page : std::filesystem::directory_iterator(QUORVAN_MAN_PAGES)) {
        EXPECT_EQ(folder.Run("LC_ALL=C.UTF-8 MANROFFSEQ= MANWIDTH=80 man --warnings -E UTF-8 -l -Tutf8 -Z '" +
                             page.path().string() + "'"),
                  0);
        EXPECT_EQ(folder.Errors(), "") << page.path();
        EXPECT_NE(folder.Output(), "");
    }
}

} // namespace
