// The archive and the Debian package, as somebody who has nothing else finds them.
#include <optional>

#include "Session.h"
#include "Shell.h"
#include "util/FolderLock.h"

namespace {

TEST(PackageTest, UnpacksToAFolderThatRuns) {
    Shell folder;
    ASSERT_EQ(folder.Run(QUORVAN_PACK
                         " -G TGZ -B packed >told && tar xzf packed/*.tar.gz && mv Quorvan-* Quorvan && "
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

// Installed into a root of the test's own, with another program to start that needs no display.
class InstalledPackage : public testing::Test {
  protected:
    InstalledPackage() {
        setenv("HOME", folder_.File("me").c_str(), 1);
        setenv("PATH", (folder_.File("root/usr/bin:") + folder_.Path() + ":" + getenv("PATH")).c_str(), 1);
        folder_.Write("notify-send", "#!/bin/sh\necho \"$*\" >>" + folder_.File("notices") + "\n");
        EXPECT_EQ(folder_.Run("mkdir me; chmod +x notify-send; " QUORVAN_PACK
                              " -G DEB -B packed && dpkg-deb -x packed/*.deb root"),
                  0)
            << folder_.Errors();
    }
    void Provide(const std::string& version) {
        folder_.Write("root/usr/lib/quorvan/quorvan",
                      "#!/bin/sh\n[ $# = 0 ] && echo \"started $0\" || echo 'quorvan " + version + "'\n");
    }
    // Whether the launcher starts the program of that folder, having said this.
    testing::AssertionResult Starts(const std::string& command, const std::string& folder,
                                    const std::string& said = "") {
        if (folder_.Run(command) != 0 || folder_.Output() != "started " + folder + "/quorvan\n")
            return testing::AssertionFailure() << command << folder_.Output() << folder_.Errors();
        return (said.empty() ? folder_.Errors().empty() : folder_.Errors().find(said) != said.npos)
                   ? testing::AssertionSuccess()
                   : testing::AssertionFailure() << folder_.Errors();
    }
    // Of all that is a person's own, in the folder that the launcher made.
    std::string State() {
        EXPECT_EQ(folder_.Run("cd me/Quorvan; stat -c '%n %Y' *.db Quorvan.*; cat *.db Quorvan.* | md5sum"),
                  0);
        return folder_.Output();
    }

    Shell folder_;
};

TEST_F(InstalledPackage, StartsFromAFolderThatItMakesAndKeepsUpToDate) {
    Provide("1.0");
    const std::string home = folder_.File("me/Quorvan");
    EXPECT_TRUE(Starts("quorvan", home, "quorvan: Made the folder " + home + " for your portfolios.\n"));
    const std::string before = State();
    EXPECT_TRUE(Starts("quorvan", home));

    Provide("1.10");
    folder_.Write("me/Quorvan/help/Quorvan.html", "old");
    std::optional<FolderLock> lock(std::in_place);
    ASSERT_EQ(lock->Take(home, "quorvan"), FolderLock::Outcome::Taken);
    EXPECT_TRUE(Starts("quorvan", home, "is in use by quorvan (process "));
    EXPECT_EQ(folder_.Read("me/Quorvan/help/Quorvan.html"), "old");
    lock.reset();
    EXPECT_TRUE(Starts("quorvan", home));
    EXPECT_NE(folder_.Read("me/Quorvan/help/Quorvan.html"), "old");
    EXPECT_EQ(folder_.Run("me/Quorvan/quorvan --version"), 0);
    Provide("1.9");
    EXPECT_TRUE(Starts("quorvan", home));
    EXPECT_EQ(folder_.Run("me/Quorvan/quorvan --version"), 0);
    EXPECT_EQ(folder_.Output(), "quorvan 1.10\n") << "it is the newer one";
    EXPECT_EQ(State(), before);
    EXPECT_EQ(folder_.Read("notices").find("Quorvan Made the folder "), 0U) << "for who sees no terminal";
}

TEST_F(InstalledPackage, HasEverythingInItsPlaceAndTakesNoForeignFolder) {
    EXPECT_EQ(folder_.Run("quorvan --version && quorvan-cli --version"), 0);
    EXPECT_EQ(folder_.Output(), "quorvan 1.0\nquorvan-cli 1.0\n");
    // What a removal could run, what the tools found it to need, and what desktops and man find.
    EXPECT_EQ(folder_.Run("dpkg-deb --ctrl-tarfile packed/*.deb | tar t | sort; dpkg-deb -f packed/*.deb "
                          "Depends | grep -o 'libqt6widgets6\\|libcurl4' | sort; cd root/usr/share && "
                          "desktop-file-validate applications/* && ls metainfo/*.xml icons/*/*/*/*.svg && "
                          "man -M man -w quorvan quorvan-cli"),
              0);
    const std::string shared = folder_.File("root/usr/share/");
    EXPECT_EQ(folder_.Output(), "./control\n./md5sums\nlibcurl4\nlibqt6widgets6\nicons/hicolor/scalable/"
                                "apps/org.quorvan.quorvan.svg\n"
                                "metainfo/org.quorvan.quorvan.metainfo.xml\n" +
                                    shared + "man/man1/quorvan.1.gz\n" + shared +
                                    "man/man1/quorvan-cli.1.gz\n");
    Provide("1.0");
    ASSERT_EQ(folder_.Run("mkdir 'a b' half other; touch half/invest.db.part other/letter file"), 0);
    EXPECT_TRUE(Starts("quorvan 'a b'", "a b", "Made the folder a b"));
    EXPECT_TRUE(Starts("quorvan half; ls half/invest.db >&2", "half", "half/invest.db"));
    const std::tuple<const char*, int, const char*> cases[] = {
        {"quorvan other", 1, "quorvan: other is no folder of Quorvan's"},
        {"quorvan file", 1, "quorvan: file is no folder of Quorvan's"},
        {"quorvan file/new", 1, "file/new cannot be made: Not a directory"},
        {"quorvan ''", 1, "the name is empty"},
        {"HOME= quorvan", 1, "There is no home folder"},
        {"chmod -x half/quorvan; quorvan half", 1, "The program half/quorvan cannot be started"},
        {"quorvan --new", 2, "Usage: quorvan"},
        {"quorvan a b", 2, "Usage: quorvan"},
    };
    for (const auto& [command, status, reason] : cases)
        EXPECT_TRUE(folder_.Fails(command, status, reason));
    EXPECT_EQ(folder_.Run("ls -A other"), 0);
    EXPECT_EQ(folder_.Output(), "letter\n");
}

} // namespace
