#include <atomic>
#include <thread>

#include <fcntl.h>
#include <sys/resource.h>

#include "InChild.h"
#include "Shell.h"
#include "util/File.h"
#include "util/FolderLock.h"
#include "util/IniFile.h"

namespace {

using std::filesystem::perms;

TEST(File, CopiesWithItsOwnerForThoseWhoMayWriteOrFails) {
    Shell folder;
    folder.Write("source", std::string(std::size_t{256} * 1024, 'x') + "tail");
    ASSERT_EQ(folder.Run("chmod 664 source; [ $(id -u) != 0 ] || chown 65534 source"), 0);
    File source, copy;
    ASSERT_EQ(source.Open(folder.File("source"), FileMode::ReadOnly), 0);
    ASSERT_EQ(copy.Open(folder.File("copy"), FileMode::CreateNew), 0);
    errno = EIO; // of an earlier call
    EXPECT_EQ(copy.CopyFrom(source), 0);
    const File moved(std::move(copy));
    EXPECT_FALSE(copy.IsOpen() || copy.IsWritten());
    EXPECT_EQ(folder.Run("cmp source copy && stat -c '%u %g 660' source && stat -c '%u %g %a' copy"), 0);
    const std::string both = folder.Output();
    EXPECT_EQ(both.substr(0, both.size() / 2), both.substr(both.size() / 2));
    struct : FileOperations {
        ssize_t WriteAt(int, const void*, std::size_t, off_t) override { return 0; }
    } stuck; // its writes get nowhere
    File file(stuck);
    ASSERT_EQ(file.Open(folder.File("new"), FileMode::CreateNew), 0);
    errno = 0;
    EXPECT_EQ(file.WriteAt(0, "x", 1), EIO);
}

TEST(File, WhatIsOpenIsNotReplaced) {
    const TemporaryFolder folder;
    const int log = creat(folder.File("log").c_str(), 0600);
    EXPECT_EQ(WriteNamedFile("/dev/fd/" + std::to_string(log), "x"), EOPNOTSUPP);
    EXPECT_TRUE(close(log) == 0 && folder.Read("log").empty());
}

TEST(File, AProbeFindsThatTheRoomEnds) {
    const TemporaryFolder folder;
    EXPECT_EQ(TryWritingIn(folder.Path()), 0);
    const auto tryInLittleRoom = [&] { // to the process the end of its room is that of a full disk
        const rlimit room{1000, 1000};
        setrlimit(RLIMIT_FSIZE, &room);
        return TryWritingIn(folder.Path());
    };
    EXPECT_EQ(ResultInChild(tryInLittleRoom), ENOSPC);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{});
}

class IniFileTest : public testing::Test {
  protected:
    std::string Value(const char* section, const char* key) const {
        char value[128];
        settings_.ReadString(section, key, "default", value);
        return value;
    }
    std::string After(const std::string& content, const char* value) const {
        folder_.Write("Quorvan.ini", content);
        EXPECT_EQ(settings_.WriteString("G", "K", value), 0);
        EXPECT_EQ(folder_.Names(), std::vector<std::string>{"Quorvan.ini"});
        return folder_.Read("Quorvan.ini");
    }
    bool Refuses(const std::string& section, const std::string& key, const std::string& value) const {
        const std::string before = folder_.Read("Quorvan.ini");
        return settings_.WriteString(section.c_str(), key.c_str(), value.c_str()) == 1 &&
               folder_.Read("Quorvan.ini") == before;
    }

    Shell folder_;
    const INI_FILEx settings_{folder_.File("Quorvan.ini").c_str()};
};

TEST_F(IniFileTest, ReadsTheFirstEntryOfTheSection) {
    folder_.Write("Quorvan.ini",
                  "Key=before any section\n;[GENERAL]\n [GENERAL]\nKey=blank\n[general]\nKey=small\n"
                  "[GENERALX]\nKey=longer\n[GENERAL] ; main\n;Key=comment\n\nno entry\nKey = blanks\n"
                  "Key=  a=b \t  \nKey=second\n[D]\nKey=other\r\nWide=120\n[GENERAL]old\nLate=yes  \n[N]\n"
                  "a=120\nb=abc\nc= -7px\nd=99999999999999999999\ne=-99999999999");
    EXPECT_EQ(Value("GENERAL", "Key") + Value("GENERAL", "Late") + Value("D", "Key"), "  a=b \tyesother\r");
    EXPECT_EQ(Value("GENERAL", "Wide") + Value("GENERAL", "no entry") + Value("NONE", "Key"),
              "defaultdefaultdefault");
    std::string numbers;
    for (const char* key : {"a", "b", "c", "d", "e", "none"})
        numbers += std::to_string(settings_.ReadInt("N", key, 50)) + " ";
    EXPECT_EQ(numbers, "120 0 -7 2147483647 -2147483648 50 ");
}

TEST_F(IniFileTest, CutsAtTheBufferAndLongLinesIntoSeveral) {
    folder_.Write("Quorvan.ini", "[G]\nPassword=12345678901234\xC3\xA4z\n");
    char small[16];
    settings_.ReadString("G", "Password", "", small);
    EXPECT_STREQ(small, "12345678901234");
    const std::string longest = "[G]\nK=" + std::string(125, 'v') + "Other=tail\n";
    folder_.Write("Quorvan.ini", longest);
    EXPECT_EQ(Value("G", "K") + Value("G", "Other"), std::string(125, 'v') + "tail");
    EXPECT_EQ(After(longest, "x"), "[G]\nK=x\nOther=tail\n");
}

TEST_F(IniFileTest, WritesInPlace) {
    const std::pair<std::string, std::string> cases[] = {
        {"; top\n[G]\n;K=c\n\nK = 1\nK=1  \nK=2\n[D]\nK=3\n",
         "; top\n[G]\n;K=c\n\nK = 1\nK=v\nK=2\n[D]\nK=3\n"},
        {"[G]\nA=1\n\n; end\n[D]\n", "[G]\nA=1\n\n; end\nK=v\n[D]\n"},
        {"[G]\nA=1", "[G]\nA=1\nK=v\n"},
        {"[G]\nK=1", "[G]\nK=v\n"},
        {"[D]\nA=1", "[D]\nA=1\n[G]\nK=v\n"},
        {"[G]\n[D]\n[G]\nK=1\n", "[G]\nK=v\n[D]\n[G]\nK=1\n"},
        {"[G]\n[G]x\nK=1\n", "[G]\n[G]x\nK=v\n"},
        {std::string("[G]\nA=\0x\r\n", 10), std::string("[G]\nA=\0x\r\nK=v\n", 14)}};
    for (const auto& [before, after] : cases)
        EXPECT_EQ(After(before, "v"), after);
    EXPECT_EQ(After("", ""), "[G]\nK=\n");
    EXPECT_EQ(settings_.WriteInt("G", "K", -12), 0);
    EXPECT_EQ(folder_.Read("Quorvan.ini"), "[G]\nK=-12\n");
}

TEST_F(IniFileTest, RefusesWhatCouldNotBeReadBackAndWhatIsNoSettingsFile) {
    const std::string longest(124, 'v');
    EXPECT_EQ(After("[G]\n", longest.c_str()), "[G]\nK=" + longest + "\n");
    for (const std::string& value : {longest + "v", std::string("a\nb"), std::string("\x7F")})
        EXPECT_TRUE(Refuses("G", "K", value)) << value;
    for (const char* key : {"K=", ";K", "[K", "", "K\r"})
        EXPECT_TRUE(Refuses("G", key, "v")) << key;
    for (const std::string& section : {std::string("G\n"), std::string(62, 's')})
        EXPECT_TRUE(Refuses(section, "K", "v")) << section;
    const INI_FILEx tooLong((folder_.Path() + std::string(128, '/') + "Quorvan.ini").c_str());
    EXPECT_EQ(tooLong.ReadInt("G", "K", 7), 7);
    EXPECT_EQ(tooLong.WriteString("G", "K", "v"), 1);
    folder_.Write("Quorvan.ini", "[G]\nK=1\n" + std::string(4 << 20, ';')); // no settings file is as long
    EXPECT_EQ(Value("G", "K"), "default");
    folder_.Clear();
    EXPECT_TRUE(Refuses("G", "K", "v"));
    EXPECT_FALSE(folder_.Has("Quorvan.ini"));
}

TEST_F(IniFileTest, KeepsPermissionsAndLinks) {
    // What a killed program left is no obstacle, and is not written through when it is a link.
    ASSERT_EQ(
        folder_.Run("mkdir there; echo '[G]' >there/real.ini; chmod 640 there/real.ini; echo mine >mine; "
                    "ln -s there/real.ini Quorvan.ini; ln -s ../mine there/ini_file.tmp"),
        0);
    EXPECT_EQ(settings_.WriteString("G", "K", "v"), 0);
    EXPECT_EQ(folder_.Run("cat there/real.ini mine; stat -c %a there/real.ini; readlink Quorvan.ini"), 0);
    EXPECT_EQ(folder_.Output(), "[G]\nK=v\nmine\n640\nthere/real.ini\n");
}

using Outcome = FolderLock::Outcome;

const std::string LockName = FolderLock::FileName;
const std::string OwnHost = Output("uname -n");

std::string LockText(const std::string& host, long process) {
    return "program: quorvan\nprocess: " + std::to_string(process) + "\nhost: " + host + "\n";
}

class FolderLockTest : public testing::Test {
  protected:
    Outcome Take() { return lock_.Take(folder_.Path(), "quorvan"); }
    Shell folder_;
    FolderLock lock_;
};

TEST_F(FolderLockTest, IsHeldByOneAndNamesItUntilReleased) {
    ASSERT_EQ(Take(), Outcome::Taken);
    const std::string text = folder_.Read(LockName);
    EXPECT_EQ(std::filesystem::status(folder_.File(LockName)).permissions(), perms{0600});
    FolderLock second;
    EXPECT_EQ(second.Take(folder_.Path(), "quorvan-cli", FolderLock::Doubt::PassOver), Outcome::Held);
    const FolderHolder& holder = second.Holder();
    EXPECT_EQ(DescribeHolder(holder), "quorvan (process " + std::to_string(getpid()) + " on the computer " +
                                          OwnHost + ", since " + holder.since + ")");
    EXPECT_EQ(holder.since.size(), 19U);
    second.Release();
    EXPECT_EQ(folder_.Read(LockName), text);
    lock_.Release();
    EXPECT_FALSE(folder_.Has(LockName));
    EXPECT_EQ(second.Take(folder_.Path(), "quorvan-cli"), Outcome::Taken);
}

// A text left behind, and whether the lock is given in spite of it.
TEST_F(FolderLockTest, DoubtsWhatTheSystemsLockDoesNotTell) {
    folder_.Run("echo $$");
    const long ended = std::stol(folder_.Output());
    const std::string alive = LockText(OwnHost, getpid());
    const FolderLock::LockCall usual = FolderLock::LockBySystem;
    const FolderLock::LockCall none = [](int /*file*/) { return ENOLCK; };
    const std::tuple<FolderLock::LockCall, std::string, Outcome> cases[] = {
        {usual, LockText("elsewhere", 17), Outcome::Doubtful},
        {usual, alive, Outcome::Taken}, // but does not hold it
        {usual, std::string(100000, '\1'), Outcome::Taken},
        {none, "", Outcome::Taken},
        {none, alive, Outcome::Doubtful},
        {none, LockText(OwnHost, ended), Outcome::Taken},
        {none, LockText("elsewhere", ended), Outcome::Doubtful}};
    for (const auto& [call, text, outcome] : cases) {
        SCOPED_TRACE(text.substr(0, 100));
        folder_.Write(LockName, text);
        FolderLock lock(call);
        EXPECT_EQ(lock.Take(folder_.Path(), "quorvan"), outcome);
        EXPECT_EQ(lock.IsTaken(), outcome == Outcome::Taken);
        EXPECT_EQ(folder_.Read(LockName) == text, outcome == Outcome::Doubtful);
        EXPECT_EQ(lock.Take(folder_.Path(), "quorvan", FolderLock::Doubt::PassOver), Outcome::Taken);
        const std::string taken = folder_.Read(LockName); // 20 bytes of it are the time
        EXPECT_EQ(taken.substr(0, taken.size() - 20), LockText(OwnHost, getpid()) + "since: ");
    }
}

TEST_F(FolderLockTest, DescribesItsHolderInOneLine) {
    EXPECT_EQ(DescribeHolder({}), "another program");
    folder_.Write(LockName, "program: " + std::string(500, 'x') + "\nhost: a\rb\nprocess: 5\n");
    ASSERT_EQ(Take(), Outcome::Doubtful);
    EXPECT_EQ(DescribeHolder(lock_.Holder()), std::string(100, 'x') + " (process 5 on the computer a\\rb)");
}

TEST_F(FolderLockTest, FailsWhereItsFileCannotBe) {
    for (const std::string make : {"mkdir ", "mkfifo ", "ln -s other "}) {
        ASSERT_EQ(folder_.Run("echo >other; " + make + LockName), 0);
        EXPECT_EQ(Take(), Outcome::Failed) << make;
        EXPECT_EQ(lock_.Error(), EINVAL) << make;
        EXPECT_TRUE(std::filesystem::remove(folder_.File(LockName))) << make;
    }
    EXPECT_EQ(folder_.Read("other"), "\n");
}

TEST_F(FolderLockTest, InAFolderThatMayOnlyBeReadIsSeenAllTheSame) {
    const auto take = [&] { // the reason of its failure, 200 when this process has it
        FolderLock lock;
        const bool held = lock.Take(folder_.Path(), "quorvan") == Outcome::Held;
        return held && lock.Holder().process == getppid() ? 200 : lock.Error();
    };
    std::filesystem::permissions(folder_.Path(), perms{0555});
    EXPECT_EQ(ResultAsOrdinaryUser(take), EACCES);
    EXPECT_EQ(ResultAsOrdinaryUser([&] { return TryWritingIn(folder_.Path()); }), EACCES);
    std::filesystem::permissions(folder_.Path(), perms{0755});
    ASSERT_EQ(Take(), Outcome::Taken);
    std::filesystem::permissions(folder_.File(LockName), perms{0444});
    EXPECT_EQ(ResultAsOrdinaryUser(take), 200);
}

// Taking, releasing and removing the file must never leave two inside.
TEST_F(FolderLockTest, LetsOneOfManyInAtATime) {
    const std::string inside = folder_.File("inside");
    std::atomic<int> met = 0;
    const auto work = [&] {
        for (int done = 0; done < 300;) {
            FolderLock lock;
            if (lock.Take(folder_.Path(), "quorvan") != Outcome::Taken)
                continue;
            met += symlink("nowhere", inside.c_str()) == 0 ? 0 : 1;
            unlink(inside.c_str());
            ++done;
        }
    };
    { const std::jthread first(work), second(work), third(work), fourth(work); }
    EXPECT_EQ(met, 0);
    EXPECT_FALSE(folder_.Has(LockName));
}

} // namespace
