// What each command refuses, or cannot do: it says so in one sentence and leaves every file alone.
#include <sstream>
#include <unistd.h>

#include "CommandTest.h"
#include "util/FolderLock.h"

namespace {

class FailureTest : public CommandTest {};

TEST_F(FailureTest, AWrongCommandLineDoesNothing) {
    // With the reason, where it is not the command line's own.
    std::istringstream wrong(
        "|quote|chart A 2000|report A|report -o A|setup|db A|db A create|db A query a b|list --sort Name|"
        "list A --sort Status|export#PORTFOLIO or --all is|export A --all|import --all A t.csv|"
        "import A#PORTFOLIO and FILE, or|import --all#PORTFOLIO and FILE, or|import A t.csv --decimal x|"
        "import A t.csv --delimiter ab#is one character|import A t.csv --column Amount=N|list ''|export ''|"
        "export A -o ''|report A -o ''|import A t.csv --column Value=N|import A t.csv --update-by name|"
        "import A t.csv --json|quote A --home home --source 'n h /q Last 2'|"
        "setup new --desktop --remove-desktop|db A delete 1 --where 'N = 1'|db A undelete --where 'N = 1'|"
        "quote ''#a ticker is empty|chart A 2000 -o new.gif#end with .png, .svg or .pdf|"
        "chart A 2000 -o new.png --scale nan#must be a number|db new.db query --format xml|"
        "db new.db set 'N = 1'#--where or --all is required|db new.db delete#A record's number is required|"
        "db new.db append N|db new.db create --column N:text");
    for (std::string line; std::getline(wrong, line, '|');) {
        const std::size_t end = std::min(line.find('#'), line.size());
        const std::string reason = end < line.size() ? line.substr(end + 1) : "Run with --help";
        EXPECT_TRUE(folder_.Fails("quorvan-cli " + line.substr(0, end), 2, reason));
    }
    EXPECT_TRUE(folder_.Fails("quorvan-cli quote \"$(printf 'A\\tB')\"", 2, "control characters"));
    EXPECT_TRUE(
        folder_.Fails("quorvan-cli quote A --source 'net h /q?s= Last'", 2, "fewer than five fields"));
    EXPECT_TRUE(folder_.Fails("quorvan-cli chart A 2008 -o new.png", 2, "'2008'; there are 2000 to 2007"));
    EXPECT_TRUE(folder_.Fails("quorvan-cli db A set 'N = 1' --where ''", 2, "the statement is empty"));
    EXPECT_EQ(folder_.Names(), std::vector<std::string>{"built"});
}

TEST_F(FailureTest, FailsInOneSentenceAndLeavesFilesAlone) {
    ASSERT_TRUE(
        Works(Setup("--sample") + R"sh(; db() { quorvan-cli db "$@"; }; db home/portfol.db append Name=A
        for _ in 1 2; do db home/invest.db append Portfolio=A Value=3e38; done
        db a.db create --column N:byte --column Name:string:8; db a.db append N=1; mkfifo p; ln -s p pipe.png; ln -s home/misc.db misc.svg
        head -c 36 a.db >bad.db; printf '\11' >>bad.db; tail -c +38 a.db >>bad.db; head -c 51 a.db >short.db
        mkdir other held left block folder.png; echo old >old.png
        cp home/*.db other; cp a.db other/invest.db; cp a.db held
        cp a.db block; echo >block/backups; cp a.db left/a.bak; cp a.db left/b.new
        cp -r home new; rm new/quorvan; cp "$(command -v quorvan-cli)" alone; cp -r home "$(printf '\377')"
        XDG_DATA_HOME=$PWD/full quorvan-cli setup home --program built --desktop
        rm -r full/applications; echo >full/applications
        printf 'Name\nA\n' >t.csv; for each in bad read lost; do cp -r home $each; done; cp home/*.db held
        db lost/invest.db append Portfolio=Lost; printf '\377' | dd of=bad/invest.db bs=1 seek=36 conv=notrunc 2>&-
        mkdir kept; cp a.db kept; chmod 777 . kept; chmod 444 kept/a.db read/*.db; chmod 555 read)sh"));
    // An ordinary user, also where the tests run as root, whom no permission keeps out.
    const std::string reader = getuid() == 0 ? "setpriv --reuid 65534 --clear-groups ./alone" : "./alone";
    EXPECT_TRUE(Works(reader + " db kept/a.db query --format tsv", "record\tN\tName\n0\t1\t\n"));
    FolderLock lock;
    ASSERT_EQ(lock.Take(folder_.File("held"), "quorvan"), FolderLock::Outcome::Taken);
    const std::string before = State();
    const std::string held = "in use by quorvan (process " + std::to_string(getpid()) + " on ";
    const std::string chart = "quorvan-cli chart --home home 'My Retirement Fund' 2000 -o ";
    const std::pair<std::string, std::string> cases[] = {
        {"quorvan-cli chart --home home B 2000 -o old.png", "there is no portfolio \"B\" in home"},
        {"quorvan-cli chart --home home A 2007 -o old.png", "a value in the portfolio is not a number, or "},
        {chart + "pipe.png", "pipe.png cannot be written: "},
        {"ulimit -f 4; trap '' XFSZ; " + chart + "old.png", "old.png cannot be written: "},
        {"quorvan-cli report --home nowhere A -o old.pdf", "there is no folder nowhere\n"},
        {"quorvan-cli report --home other 'My Retirement Fund' -o a", "other/invest.db has other columns"},
        {"quorvan-cli report --home home A -o missing/a", "missing/a cannot be written: No such file"},
        {Setup("", "built/home"), "cannot be made: Not a directory"},
        {Setup("", ""), "the name is empty"},
        {Setup("", std::string(109, 'd')), "path is too long"},
        {Setup("", "held"), held},
        {"./alone setup new", "The program quorvan was not found beside quorvan-cli"},
        {"quorvan-cli setup home --program nothing --desktop", "nothing cannot be read: No such file"},
        {"XDG_DATA_HOME=relative HOME= " + Setup("--remove-desktop"), "There is no home folder"},
        {"XDG_DATA_HOME=$PWD/full " + Setup("--desktop"), ".desktop cannot be made: Not a directory"},
        {Setup("--desktop", "\xFF"), "its path has a sign that no entry can hold"},
        {"quorvan-cli db folder.png info", "this is no regular file"},
        {"quorvan-cli db short.db info", "the file ends after 51 of the header's 52 bytes"},
        {"quorvan-cli db a.db query >/dev/full", "the output cannot be written: No space left on device"},
        {"quorvan-cli db a.db load missing", "1801 "},
        {"quorvan-cli db a.db query Name=", ": a condition is a column, an operator and a value"},
        {"quorvan-cli db a.db query --sort Nome", "1701 "},
        {"quorvan-cli db a.db append N=1 N=2", "the column N is given twice"},
        {"quorvan-cli db a.db append N=x", "a.db: N: 'x' is no whole number from -128 to 127"},
        {"quorvan-cli db a.db set 'N = 128' --all", "a.db: N: '128' is no whole number"},
        {"quorvan-cli db a.db append Nn=1", "'Nn=1' begins with no column's name"},
        {"quorvan-cli db a.db set N=1 --all", ": a change is a column, an operator and a value"},
        {"quorvan-cli db a.db export no/where", "1901 Export error - unable to open output file (No such"},
        {"quorvan-cli db a.db create --column N:byte", "1102 Create error - file already exists"},
        {"quorvan-cli db n create --column N:byte --column N:long", "the column N is given twice"},
        {"quorvan-cli db n create --column N:byte --description $(printf %032d 1)", "31 bytes"},
        {"quorvan-cli db bad.db append", "its header disagrees with it; nothing is changed before `check"},
        {reader + " db kept/a.db append", "the file may only be read, not changed"},
        {"quorvan-cli db held/a.db append", held},
        {"quorvan-cli db held/a.db check --repair", held},
        {"quorvan-cli update A --home held", held},
        {"quorvan-cli db left/a.db info", "file could not be opened: there is no such file, but "},
        {"quorvan-cli db left/b.db create --column N:byte", "left/b.new, as an interrupted compaction"},
        {"quorvan-cli db block/a.db append", "the day's backup cannot be made in the folder backups"},
        {"quorvan-cli list a --home home", "there is no portfolio \"a\" in home, but \"A\""},
        {"quorvan-cli list --home home >/dev/full", "the output cannot be written: No space left on device"},
        {"quorvan-cli export --all --home home -o left", "left cannot be written: Is a directory"},
        {"quorvan-cli import B t.csv --home home", "there is no portfolio 'B'; --create makes it"},
        {"quorvan-cli import a t.csv --create --home home", "\"a\" in home, but \"A\""},
        {"quorvan-cli import $(seq -s x 20) t.csv --create --home home", "can be no portfolio's name"},
        {"quorvan-cli import Lost t.csv --create --home lost", "`quorvan-cli check --repair` lists it"},
        {"quorvan-cli import A t.csv --home held", held},
        {"quorvan-cli import A t.csv --home bad", "bad/invest.db is damaged: its header disagrees with it"},
        {reader + " import A t.csv --home read", "programs cannot be kept out of the folder: read/"},
        {"quorvan-cli check --repair --home held", held},
        {"quorvan-cli check --home nowhere >/dev/full", "quorvan-cli: there is no folder nowhere\n"},
        {"quorvan-cli import ' ' t.csv --create --home home", "can be no portfolio's name"},
        {"quorvan-cli import A left --home home", "left cannot be read: it is no regular file"},
        {"quorvan-cli export A --home home -o home/invest.db", "is the folder's own invest.db, which"},
        {"quorvan-cli report A --home home -o home/cut.db", "home/cut.db is the folder's own cut.db, which"},
        {"quorvan-cli chart A 2000 --home home -o misc.svg", "misc.svg is the folder's own misc.db, which"},
        {"quorvan-cli export A --home home -o /dev/stdout >>old.png", "what is open already, which is not"},
    };
    for (const auto& [command, reason] : cases)
        EXPECT_TRUE(folder_.Fails(command, 1, reason));
    EXPECT_EQ(State(), before);
}

} // namespace
