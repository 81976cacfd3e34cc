#include "util/FolderLock.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <filesystem>
#include <string>
#include <thread>
#include <tuple>
#include <vector>

#include <sys/resource.h>

#include "InChild.h"
#include "Shell.h"
#include "util/FolderProbe.h"

namespace {

using Outcome = FolderLock::Outcome;
using std::filesystem::perms;

const std::string Name = FolderLock::FileName;

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
    const std::string text = folder_.Read(Name);
    EXPECT_EQ(std::filesystem::status(folder_.File(Name)).permissions(), perms{0600});
    FolderLock second;
    EXPECT_EQ(second.Take(folder_.Path(), "quorvan-cli", FolderLock::Doubt::PassOver), Outcome::Held);
    EXPECT_FALSE(second.IsTaken());
    const FolderHolder& holder = second.Holder();
    EXPECT_EQ(std::tuple(holder.program, holder.process, holder.host, holder.since.size()),
              std::tuple("quorvan", getpid(), OwnHost(), 19U));
    second.Release();
    EXPECT_EQ(folder_.Read(Name), text);
    lock_.Release();
    EXPECT_FALSE(folder_.Has(Name));
    EXPECT_EQ(second.Take(folder_.Path(), "quorvan-cli"), Outcome::Taken);
    EXPECT_EQ(Take(), Outcome::Held);
    EXPECT_EQ(lock_.Holder().program, "quorvan-cli");
}

TEST_F(FolderLockTest, OfAKilledProcessIsNoObstacle) {
    WaitingChild child([&] { static_cast<void>(Take()); });
    EXPECT_EQ(Take(), Outcome::Held);
    EXPECT_EQ(lock_.Holder().process, child.Id());
    child.Kill();
    EXPECT_NE(folder_.Read(Name), "");
    EXPECT_EQ(Take(), Outcome::Taken);
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
        {usual, "program: quor", Outcome::Taken},
        {usual, std::string(100000, '\1'), Outcome::Taken},
        {none, "", Outcome::Taken},
        {none, alive, Outcome::Doubtful},
        {none, LockText(OwnHost(), ended.Id()), Outcome::Taken},
        {none, LockText("elsewhere", ended.Id()), Outcome::Doubtful}};
    for (const auto& [call, text, outcome] : cases) {
        SCOPED_TRACE(text.substr(0, 100));
        folder_.Write(Name, text);
        FolderLock lock(call);
        EXPECT_EQ(lock.Take(folder_.Path(), "quorvan"), outcome);
        EXPECT_EQ(lock.IsTaken(), outcome == Outcome::Taken);
        if (outcome == Outcome::Doubtful) {
            EXPECT_EQ(folder_.Read(Name), text);
            EXPECT_EQ(lock.Take(folder_.Path(), "quorvan", FolderLock::Doubt::PassOver), Outcome::Taken);
        }
        EXPECT_NE(folder_.Read(Name).find("host: " + OwnHost() + "\n"), std::string::npos);
        EXPECT_LT(folder_.Read(Name).size(), 400U);
    }
}

TEST_F(FolderLockTest, DescribesItsHolderInOneLine) {
    EXPECT_EQ(DescribeHolder({}), "another program");
    EXPECT_EQ(DescribeHolder({"quorvan", 4711, "desk", "2026-11-22 14:03:07"}),
              "quorvan (process 4711 on the computer desk, since 2026-11-22 14:03:07)");
    folder_.Write(Name, "program: " + std::string(500, 'x') + "\nhost: a\rb\nprocess: 5\n");
    ASSERT_EQ(Take(), Outcome::Doubtful);
    EXPECT_EQ(DescribeHolder(lock_.Holder()), std::string(100, 'x') + " (process 5 on the computer a?b)");
}

TEST_F(FolderLockTest, FailsWhereItsFileCannotBe) {
    folder_.Write("other", "text");
    for (const std::string make : {"mkdir ", "mkfifo ", "ln -s other "}) {
        ASSERT_EQ(folder_.Run(make + Name), 0);
        EXPECT_EQ(Take(), Outcome::Failed) << make;
        EXPECT_EQ(lock_.Error(), EINVAL) << make;
        EXPECT_TRUE(std::filesystem::remove(folder_.File(Name))) << make;
    }
    EXPECT_EQ(folder_.Read("other"), "text");
    EXPECT_EQ(lock_.Take(folder_.File("none"), "quorvan"), Outcome::Failed);
    EXPECT_EQ(lock_.Error(), ENOENT);
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
    EXPECT_EQ(TryWritingIn(folder_.Path()), 0);
    ASSERT_EQ(Take(), Outcome::Taken);
    std::filesystem::permissions(folder_.File(Name), perms{0444});
    EXPECT_EQ(ResultAsOrdinaryUser(take), 200);
    EXPECT_EQ(folder_.Names(), std::vector{Name});
    lock_.Release();
    folder_.Write(Name, LockText(OwnHost(), getpid()));
    std::filesystem::permissions(folder_.File(Name), perms{0444});
    EXPECT_EQ(ResultAsOrdinaryUser(take), EACCES) << "nobody holds it";
}

// Taking, releasing and removing the file must never leave two inside.
TEST_F(FolderLockTest, LetsOneOfManyInAtATime) {
    const std::string inside = folder_.File("inside");
    std::atomic<int> met = 0;
    const auto work = [&] {
        for (int done = 0; done < 300;) {
            FolderLock lock;
            if (lock.Take(folder_.Path(), "quorvan") == Outcome::Taken) {
                std::error_code error;
                std::filesystem::create_symlink("nowhere", inside, error);
                met += error ? 1 : 0;
                std::filesystem::remove(inside, error);
                ++done;
            }
        }
    };
    { const std::jthread first(work), second(work), third(work), fourth(work); }
    EXPECT_EQ(met, 0);
    EXPECT_FALSE(folder_.Has(Name));
}

TEST_F(FolderLockTest, AProbeFindsThatTheRoomEnds) {
    const auto tryInLittleRoom = [&] { // to the process the end of its room is that of a full disk
        const rlimit room{1000, 1000};
        setrlimit(RLIMIT_FSIZE, &room);
        return TryWritingIn(folder_.Path());
    };
    EXPECT_EQ(ResultInChild(tryInLittleRoom), ENOSPC);
    EXPECT_EQ(folder_.Names(), std::vector<std::string>{});
}

} // namespace
