// The archive and the Debian package, as somebody who has nothing else finds them.
#include "Session.h"
#include "Shell.h"

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
    Process running("exec " + folder.File("Quorvan/quorvan"));
    const std::string seen = "xdotool search --onlyvisible --name '^Quorvan$' 2>/dev/null";
    EXPECT_TRUE(WaitUntil([&] { return running.HasEnded() || !Output(seen).empty(); }));
    EXPECT_FALSE(running.HasEnded());
}

// Installs the package into a root of the test's own, with another program to start that needs no display.
// What a person of that root is told and gets, the test's folder written as a full stop.
class Installed : public testing::Test {
  protected:
    Installed() {
        folder_.Write("notify-send", "#!/bin/sh\necho \"$2\" >>'" + folder_.File("notices") + "'\n");
        EXPECT_EQ(folder_.Run("chmod +x notify-send; mkdir me; " QUORVAN_PACK
                              " -G DEB -B packed && dpkg-deb -x packed/*.deb root"),
                  0);
    }
    std::string Told(const std::string& script) {
        folder_.Run(R"(export HOME=$PWD/me PATH=$PWD/root/usr/bin:$PWD:$PATH; provide() {
            printf '#!/bin/sh\n[ $# = 0 ] && echo "starts $0" || echo quorvan %s\n' $1 >root/usr/lib/quorvan/quorvan; }
            { )" + script +
                    "\n} 2>&1 | sed \"s|$PWD|.|g\"");
        return folder_.Output();
    }

    Shell folder_;
};

TEST_F(Installed, HasAllInItsPlaceAndNothingThatRunsOnRemoval) {
    EXPECT_EQ(
        Told(R"(quorvan --version; quorvan-cli --version; dpkg-deb --ctrl-tarfile packed/*.deb | tar t | sort
        dpkg-deb -f packed/*.deb Depends | grep -o 'libqt6widgets6\|libcurl4' | sort; cd root/usr/share
        desktop-file-validate applications/*; ls metainfo/*.xml icons/*/*/*/*.svg
        man -M man -w quorvan quorvan-cli | grep -o '[^/]*$')"),
        "quorvan 1.0\nquorvan-cli 1.0\n./control\n./md5sums\nlibcurl4\nlibqt6widgets6\n"
        "icons/hicolor/scalable/apps/org.quorvan.quorvan.svg\n"
        "metainfo/org.quorvan.quorvan.metainfo.xml\nquorvan.1.gz\nquorvan-cli.1.gz\n");
    Told("provide 1.0; mkdir half other; touch half/invest.db.part other/letter");
    const std::pair<const char*, const char*> cases[] = {
        {"quorvan 'a b'", "quorvan: Made the folder a b for your portfolios.\nstarts a b/quorvan\n"},
        {"quorvan half; ls half/invest.db", "starts half/quorvan\nhalf/invest.db\n"},
        {"quorvan other 2>told; ls other; cat told", "letter\nquorvan: other is no folder of Quorvan's"},
        {"quorvan other/letter/new", "quorvan: The folder ./other/letter/new cannot be made: Not a dir"},
        {"HOME= quorvan", "quorvan: There is no home folder; name a folder: quorvan FOLDER\n"},
        {"chmod -x half/quorvan; quorvan half", "quorvan: The program half/quorvan cannot be started.\n"},
        {"quorvan --new 2>told; echo $?; quorvan a b 2>told; echo $?", "2\n2\n"},
        {"quorvan -h | head -n 1; ln -s gone link; quorvan link",
         "Usage: quorvan [FOLDER]\nquorvan: link is a link to a folder that is not there.\n"},
        {"rm 'a b/misc.db'; quorvan 'a b'; ls 'a b/misc.db'",
         "quorvan: Made what was missing in the folder a b.\nstarts a b/quorvan\na b/misc.db\n"},
    };
    for (const auto& [command, told] : cases)
        EXPECT_EQ(Told(command).substr(0, std::string(told).size()), told);
}

TEST_F(Installed, MakesAFolderAndKeepsItUpToDate) {
    EXPECT_EQ(
        Told(R"(provide 1.0; quorvan; cat me/Quorvan/*.db | md5sum >sum; quorvan
        provide 1.10; cd me/Quorvan; rm help/Quorvan.html; mkdir help/Quorvan.html; quorvan 2>told
        ./quorvan --version; rm -r told help/Quorvan.html; echo old >help/Quorvan.html; echo 'host: elsewhere' >Quorvan.lock
        quorvan; cat help/Quorvan.html; rm Quorvan.lock
        quorvan; ./quorvan --version; grep -c '<h1>' help/Quorvan.html; cd ../..
        provide 1.9; quorvan; me/Quorvan/quorvan --version; cat me/Quorvan/*.db | md5sum | cmp - sum; head -n 1 notices)"),
        "quorvan: Made the folder ./me/Quorvan for your portfolios.\n"
        "starts ./me/Quorvan/quorvan\nstarts ./me/Quorvan/quorvan\n"
        "starts ./me/Quorvan/quorvan\nquorvan 1.0\n"
        "quorvan: The folder ./me/Quorvan was in use by another program; once that program has ended, delete "
        "./me/Quorvan/Quorvan.lock.\nstarts ./me/Quorvan/quorvan\nold\n"
        "starts ./me/Quorvan/quorvan\nquorvan 1.10\n1\n"
        "starts ./me/Quorvan/quorvan\nquorvan 1.10\nMade the folder ./me/Quorvan for your portfolios.\n");
}

} // namespace
