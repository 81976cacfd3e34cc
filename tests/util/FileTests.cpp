#include <gtest/gtest.h>

#include <atomic>
#include <csignal>
#include <thread>

#include <sys/resource.h>

#include "InChild.h"
#include "Shell.h"
#include "util/File.h"
#include "util/FolderLock.h"
#include "util/IniFile.h"

namespace {

using std::filesystem::perms;

constexpr const char* Name = "Quorvan.ini";
const std::string LockName = FolderLock::FileName;

TEST(File, CopiesWithItsOwnerForThoseWhoMayWrite) {
    const TemporaryFolder folder;
    folder.Write("source", std::string(std::size_t{256} * 1024, 'x') + "tail");
    std::filesystem::permissions(folder.File("source"), perms{0664});
    ASSERT_TRUE(getuid() != 0 || chown(folder.File("source").c_str(), 65534, getgid()) == 0);
    File source, copy;
    ASSERT_EQ(source.Open(folder.File("source"), FileMode::ReadOnly), 0);
    ASSERT_EQ(copy.Open(folder.File("copy"), FileMode::CreateNew), 0);
    errno = EIO; // of an earlier call
    EXPECT_EQ(copy.CopyFrom(source), 0);
    EXPECT_EQ(folder.Read("copy"), folder.Read("source"));
    const File moved(std::move(copy));
    EXPECT_FALSE(copy.IsOpen() || copy.IsWritten());
    struct stat theirs {
    }, ours{};
    ASSERT_EQ(stat(folder.File("source").c_str(), &theirs) + stat(folder.File("copy").c_str(), &ours), 0);
    EXPECT_EQ(std::tuple(ours.st_uid, ours.st_gid, ours.st_mode & 0777),
              std::tuple(theirs.st_uid, theirs.st_gid, 0660U));
}

TEST(File, AWriteThatGetsNowhereFails) {
    struct : FileOperations {
        ssize_t WriteAt(int /*file*/, const void* /*data*/, std::size_t /*size*/, off_t /*at*/) override {
            return 0;
        }
    } stuck;
    const TemporaryFolder folder;
    File file(stuck);
    ASSERT_EQ(file.Open(folder.File("new"), FileMode::CreateNew), 0);
    errno = 0;
    EXPECT_EQ(file.WriteAt(0, "x", 1), EIO);
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
        Settings().ReadString(section, key, "default", value);
        return value;
    }
    std::string After(const std::string& content, const char* value) const {
        folder_.Write(Name, content);
        EXPECT_EQ(Settings().WriteString("G", "K", value), 0);
        EXPECT_EQ(folder_.Names(), std::vector<std::string>{Name});
        return folder_.Read(Name);
    }
    // Whether the entry is refused and the file as it was.
    bool Refuses(const std::string& section, const std::string& key, const std::string& value) const {
        const std::string before = folder_.Read(Name);
        return Settings().WriteString(section.c_str(), key.c_str(), value.c_str()) == 1 &&
               folder_.Read(Name) == before;
    }
    INI_FILEx Settings() const { return INI_FILEx(folder_.File(Name).c_str()); }

    TemporaryFolder folder_;
};

TEST_F(IniFileTest, ReadsTheFirstEntryOfTheSection) {
    folder_.Write(Name, "Key=before any section\n;[GENERAL]\n [GENERAL]\nKey=blank\n[general]\nKey=small\n"
                        "[GENERALX]\nKey=longer\n[GENERAL] ; main\n;Key=comment\n\nno entry\nKey = blanks\n"
                        "Key=  a=b \t  \nKey=second\n[D]\nKey=other\r\nWide=120\n[GENERAL]old\nLate=yes  ");
    EXPECT_EQ(Value("GENERAL", "Key") + Value("GENERAL", "Late") + Value("D", "Key"), "  a=b \tyesother\r");
    EXPECT_EQ(Value("GENERAL", "Wide") + Value("GENERAL", "no entry") + Value("NONE", "Key"),
              "defaultdefaultdefault");
    folder_.Write(Name, "[D]\na=120\nb=abc\nc= -7px\nd=99999999999999999999\ne=-99999999999\n");
    std::vector<int> numbers;
    for (const char* key : {"a", "b", "c", "d", "e", "none"})
        numbers.push_back(Settings().ReadInt("D", key, 50));
    EXPECT_EQ(numbers, (std::vector<int>{120, 0, -7, 2147483647, -2147483647 - 1, 50}));
}

TEST_F(IniFileTest, CutsAtTheBufferAndLongLinesIntoSeveral) {
    folder_.Write(Name, "[G]\nPassword=12345678901234\xC3\xA4z\n");
    char small[16];
    Settings().ReadString("G", "Password", "", small);
    EXPECT_STREQ(small, "12345678901234");
    const std::string longest = "[G]\nK=" + std::string(125, 'v') + "Other=tail\n";
    folder_.Write(Name, longest);
    EXPECT_EQ(Value("G", "K") + Value("G", "Other"), std::string(125, 'v') + "tail");
    EXPECT_EQ(After(longest, "x"), "[G]\nK=x\nOther=tail\n");
}

TEST_F(IniFileTest, WritesInPlace) {
    // The first occurrence of the key changes and nothing else. A new key goes before the next header, or to
    // the end of the file, which may lack its line feed; a new section goes to the end.
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
    EXPECT_EQ(Settings().WriteInt("G", "K", -12), 0);
    EXPECT_EQ(folder_.Read(Name), "[G]\nK=-12\n");
}

TEST_F(IniFileTest, RefusesWhatCouldNotBeReadBack) {
    const std::string longest(124, 'v');
    EXPECT_EQ(After("[G]\n", longest.c_str()), "[G]\nK=" + longest + "\n");
    const std::string cases[][3] = {{"G", "K", longest + "v"},
                                    {"G", "K", "a\nb"},
                                    {"G", "K", "\x7F"},
                                    {"G", "K=", "v"},
                                    {"G", ";K", "v"},
                                    {"G", "[K", "v"},
                                    {"G", "", "v"},
                                    {"G\n", "K", "v"},
                                    {"G", "K\r", "v"},
                                    {std::string(62, 's'), "K", "v"}};
    for (const auto& [section, key, value] : cases)
        EXPECT_TRUE(Refuses(section, key, value)) << section << key << value;
}

TEST_F(IniFileTest, WhatIsNoSettingsFileGivesDefaultsAndStays) {
    EXPECT_TRUE(Refuses("G", "K", "v"));
    EXPECT_FALSE(folder_.Has(Name));
    folder_.Write(Name, "[G]\nK=1\n");
    const INI_FILEx tooLong((folder_.Path() + std::string(128, '/') + Name).c_str());
    EXPECT_EQ(tooLong.ReadInt("G", "K", 7), 7);
    EXPECT_EQ(tooLong.WriteString("G", "K", "v"), 1);
    folder_.Write(Name, "[G]\nK=1\n" + std::string(4 << 20, ';')); // no settings file is as long
    EXPECT_EQ(Value("G", "K"), "default");
}

TEST_F(IniFileTest, KeepsPermissionsAndLinks) {
    std::filesystem::create_directory(folder_.File("elsewhere"));
    folder_.Write("elsewhere/real.ini", "[G]\nK=1\n");
    folder_.Write("mine", "mine");
    std::filesystem::create_symlink("elsewhere/real.ini", folder_.File(Name));
    // What a killed program left is no obstacle, and is not written through when it is a link.
    std::filesystem::create_symlink("../mine", folder_.File("elsewhere/ini_file.tmp"));
    std::filesystem::permissions(folder_.File(Name), perms{0640});
    EXPECT_EQ(Settings().WriteString("G", "K", "v"), 0);
    EXPECT_EQ(folder_.Read("elsewhere/real.ini") + folder_.Read("mine"), "[G]\nK=v\nmine");
    EXPECT_TRUE(std::filesystem::is_symlink(folder_.File(Name)));
    EXPECT_EQ(std::filesystem::status(folder_.File(Name)).permissions(), perms{0640});
}

using Outcome = FolderLock::Outcome;

std::string OwnHost() {
    char name[256] = "";
    gethostname(name, sizeof name - 1);
    return name;
}

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
    EXPECT_EQ(std::tuple(holder.program, holder.process, holder.host, holder.since.size()),
              std::tuple("quorvan", getpid(), OwnHost(), 19U));
    second.Release();
    EXPECT_EQ(folder_.Read(LockName), text);
    lock_.Release();
    EXPECT_FALSE(folder_.Has(LockName));
    EXPECT_EQ(second.Take(folder_.Path(), "quorvan-cli"), Outcome::Taken);
}

// A text left behind, and whether the lock is given in spite of it.
TEST_F(FolderLockTest, DoubtsWhatTheSystemsLockDoesNotTell) {
    WaitingChild ended([] {});
    ended.Kill();
    const std::string alive = LockText(OwnHost(), getpid());
    const FolderLock::LockCall usual = FolderLock::LockBySystem;
    const FolderLock::LockCall none = [](int /*file*/) { return ENOLCK; };
    const std::tuple<FolderLock::LockCall, std::string, Outcome> cases[] = {
        {usual, LockText("elsewhere", 17), Outcome::Doubtful},
        {usual, alive, Outcome::Taken}, // but does not hold it
        {usual, std::string(100000, '\1'), Outcome::Taken},
        {none, "", Outcome::Taken},
        {none, alive, Outcome::Doubtful},
        {none, LockText(OwnHost(), ended.Id()), Outcome::Taken},
        {none, LockText("elsewhere", ended.Id()), Outcome::Doubtful}};
    for (const auto& [call, text, outcome] : cases) {
        SCOPED_TRACE(text.substr(0, 100));
        folder_.Write(LockName, text);
        FolderLock lock(call);
        EXPECT_EQ(lock.Take(folder_.Path(), "quorvan"), outcome);
        EXPECT_EQ(lock.IsTaken(), outcome == Outcome::Taken);
        if (outcome == Outcome::Doubtful) {
            EXPECT_EQ(folder_.Read(LockName), text);
            EXPECT_EQ(lock.Take(folder_.Path(), "quorvan", FolderLock::Doubt::PassOver), Outcome::Taken);
        }
        EXPECT_EQ(folder_.Read(LockName).find(LockText(OwnHost(), getpid()) + "since: "), 0U);
        EXPECT_LT(folder_.Read(LockName).size(), 400U);
    }
}

TEST_F(FolderLockTest, DescribesItsHolderInOneLine) {
    EXPECT_EQ(DescribeHolder({}), "another program");
    EXPECT_EQ(DescribeHolder({"quorvan", 4711, "desk", "2026-11-22 14:03:07"}),
              "quorvan (process 4711 on the computer desk, since 2026-11-22 14:03:07)");
    folder_.Write(LockName, "program: " + std::string(500, 'x') + "\nhost: a\rb\nprocess: 5\n");
    ASSERT_EQ(Take(), Outcome::Doubtful);
    EXPECT_EQ(DescribeHolder(lock_.Holder()), std::string(100, 'x') + " (process 5 on the computer a?b)");
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
            std::error_code error;
            std::filesystem::create_symlink("nowhere", inside, error);
            met += error ? 1 : 0;
            std::filesystem::remove(inside, error);
            ++done;
        }
    };
    { const std::jthread first(work), second(work), third(work), fourth(work); }
    EXPECT_EQ(met, 0);
    EXPECT_FALSE(folder_.Has(LockName));
}

} // namespace
