#include "CommandTest.h"
#include "Session.h"

namespace {

const std::string Entry = "data/applications/org.quorvan.quorvan.desktop";
const std::string Icon = "data/icons/hicolor/scalable/apps/org.quorvan.quorvan.svg";
const std::string Metainfo = "data/metainfo/org.quorvan.quorvan.metainfo.xml";

class SetupTest : public CommandTest {};

TEST_F(SetupTest, MakesAFolderThatRuns) {
    // Of the sources a short line would end the list, and a long one would be taken for two.
    EXPECT_EQ(Printed("umask 0; " + Setup(">told") +
                      R"(; find home -type f -printf '%P\n' | sort >made
        sed -n 's/^made  \([^:]*\).*/\1/p' told | sort | diff - made; cd home; cmp quorvan ../built
        grep -o 'src="pictures/[^"]*' help/Quorvan.html | cut -d \" -f 2 | sort -u >shown
        cd help; ls -d pictures/* | diff - ../shown; cd ..; rm shown
        for name in Quorvan.ini Quorvan.cfg help/Quorvan.html; do cmp $name ')" QUORVAN_SOURCES
                      R"('/resources/$name; done; ! grep -vE '^;.{8,253}$' Quorvan.cfg)"),
              "");
    EXPECT_EQ(Printed("cd home; stat -c '%n %a' * . help/* | sort; stat -c %a help/pictures/* | sort -u"),
              ". 700\nQuorvan.cfg 600\nQuorvan.ini 600\nhelp 700\nhelp/Quorvan.html 600\nhelp/pictures 700\n"
              "invest.db 600\nmisc.db 600\nportfol.db 600\nquorvan 700\nquorvan-cli 700\n600\n");
    EXPECT_EQ(
        Printed("for name in portfol invest misc; do quorvan-cli db home/$name.db info --format tsv; done"
                " | grep -v ^desc | cut -f 1,3,6,7"),
        "Quorvan portfolios\t0\t1\t33\nQuorvan investments\t0\t13\t231\nQuorvan pick lists\t16\t2\t65\n");
}

TEST_F(SetupTest, NeverChangesAFileThatExists) {
    ASSERT_TRUE(Works(Setup() + R"(; cd home; echo mine | tee Quorvan.ini help/Quorvan.html >quorvan
        ln -sf nowhere Quorvan.cfg; mv misc.db misc.bak; chmod 755 quorvan)"));
    const std::string before = State("home");
    EXPECT_TRUE(Works(Setup("--sample"), "kept  Quorvan.ini\n"));
    for (const char* kept : {"kept  quorvan: it differs", "kept  misc.bak\n", "no sample"})
        EXPECT_TRUE(folder_.Says(kept));
    EXPECT_EQ(State("home"), before);
    EXPECT_TRUE(Works("mv home/misc.bak home/misc.new; " + Setup(), "kept  misc.new\n"));
    // What is missing is made anew, without a sample while the other data file has its own.
    EXPECT_TRUE(Works("rm home/invest.db; " + Setup("--sample"), "made  invest.db: empty\n"));
    EXPECT_TRUE(Works(Setup("--update-program"),
                      "made  help/Quorvan.html: brought up to date\nkept  help/pictures/"));
    EXPECT_EQ(Printed("cd home; stat -c %a quorvan; cmp quorvan ../built; cat Quorvan.ini"), "755\nmine\n");
}

TEST_F(SetupTest, AFullDiskLeavesNoPartOfAFile) {
    // Room for the settings, for neither the help nor the sample.
    EXPECT_EQ(folder_.Run("ulimit -f 8; " + Setup("--sample")), 1);
    EXPECT_TRUE(folder_.Complains("invest.db cannot be made"));
    EXPECT_TRUE(folder_.Complains("help/Quorvan.html cannot be made: File too large"));
    EXPECT_EQ(Printed("cd home; ls; rmdir help/pictures help"),
              "Quorvan.cfg\nQuorvan.ini\nhelp\nmisc.db\nquorvan\n");
    EXPECT_TRUE(Works(Setup("--sample"), "made  invest.db: sample investments\n"));
    EXPECT_EQ(
        Printed("quorvan-cli check --home home; quorvan-cli list --json --home home | cut -d , -f 1,2"),
        "nothing is wrong\n{\"Portfolio\":\"F\xC3\xBCr sp\xC3\xA4ter\",\"Investments\":16\n"
        "{\"Portfolio\":\"My Retirement Fund\",\"Investments\":16\n{\"Portfolio\":null,\"Investments\":32\n");
}

TEST_F(SetupTest, TheDesktopStartsTheProgramOfAnyFolder) {
    for (const std::string name : {"home", "My Folder", "a\"b`c`d$HOME$$e", "\\back\\\\slash\\", "100% %f %%",
                                   "a=b %", "F\xC3\xBCr sp\xC3\xA4ter; (x) & ~ # * ? < > | [y]"}) {
        ASSERT_TRUE(Works(Setup("--desktop", name)));
        EXPECT_EQ(Printed("find data -type f | sort"),
                  (Entry + "\n").append(Icon + "\n").append(Metainfo + "\n"));
        ASSERT_TRUE(Works("f=" + Entry + "; desktop-file-validate $f && gio launch $f")) << name;
        const auto started = [&] { return folder_.Read(name + "/started") == "0\n"; }; // no argument
        EXPECT_TRUE(WaitUntil(started)) << folder_.Read(Entry);
    }
    EXPECT_TRUE(Works("appstreamcli validate --no-net " + Metainfo));
    EXPECT_TRUE(Works("XDG_DATA_HOME= HOME=$PWD/me " + Setup("--desktop"),
                      "/me/.local/share/applications/org.quorvan.quorvan.desktop\n"));
}

TEST_F(SetupTest, TheLastFolderIsStartedAndTakenOut) {
    EXPECT_TRUE(Works(Setup("--desktop", "one"), "made  " + folder_.File(Entry)));
    EXPECT_TRUE(Works(Setup("--desktop", "one"), "kept  " + folder_.File(Entry)));
    EXPECT_TRUE(Works(Setup("--desktop", "two"), "in place of one for " + folder_.File("one/quorvan")));
    EXPECT_TRUE(Works(Setup("--remove-desktop", "one"), "it starts " + folder_.File("two/quorvan")));
    EXPECT_TRUE(folder_.Has(Entry) && folder_.Has(Icon) && folder_.Has(Metainfo));
    // Even when the folder has gone already; and it is not made again.
    EXPECT_TRUE(Works("rm -r two; " + Setup("--remove-desktop", "two"), "removed  "));
    EXPECT_EQ(Printed("find data -type f; " + Setup("--remove-desktop", "two") + "; [ ! -e two ]"), "");
}

TEST_F(SetupTest, TheDesktopsForeignFilesAreNotHarmed) {
    for (const std::string& foreign : {"echo >" + Entry, "ln -s nowhere " + Icon, "echo >" + Metainfo}) {
        const std::string name = foreign.substr(foreign.find("data/"));
        ASSERT_TRUE(Works(("rm -rf data; " + Setup("--desktop") + "; rm " + name).append("; " + foreign)));
        const std::string before = State(name);
        EXPECT_TRUE(folder_.Fails(Setup("--desktop"), 1, name + " is there already and is not Quorvan's"));
        EXPECT_EQ(Printed(Setup("--remove-desktop >told") + "; find data ! -type d"), name + "\n");
        EXPECT_EQ(State(name), before);
    }
}

} // namespace
