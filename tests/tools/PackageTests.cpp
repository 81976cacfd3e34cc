// The archive, as somebody who has nothing else finds it.
#include "Session.h"
#include "Shell.h"

namespace {

TEST(PackageTest, UnpacksToAFolderThatRuns) {
    Shell folder;
    ASSERT_EQ(folder.Run(QUORVAN_PACK
                         " -B packed >told && tar xzf packed/*.tar.gz && mv Quorvan-* Quorvan && "
                         "ls Quorvan/README.txt Quorvan/share/man/man1/quorvan.1 >told && "
                         "find Quorvan -name '*.db' -o -name Quorvan.ini -o -name Quorvan.cfg"),
              0);
    EXPECT_EQ(folder.Output(), "") << "unpacked over a folder in use it would take the place of a person's";
    ASSERT_EQ(folder.Run("Quorvan/bin/quorvan-cli setup home --sample && cmp home/quorvan Quorvan/quorvan && "
                         "cd Quorvan && bin/quorvan-cli setup . && [ -f invest.db ]"),
              0);

    const Display display;
    for (const char* program : {"home/quorvan", "Quorvan/quorvan"}) {
        Process running("exec " + folder.File(program));
        EXPECT_TRUE(WaitUntil([&] {
            return running.HasEnded() ||
                   !Output("xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null").empty();
        }));
        EXPECT_FALSE(running.HasEnded()) << program;
    }
}

} // namespace
