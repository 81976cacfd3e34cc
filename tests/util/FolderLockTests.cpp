#include "util/FolderLock.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include "InChild.h"
#include "TemporaryFolder.h"
#include "util/FolderProbe.h"

namespace {

using Outcome = FolderLock::Outcome;

int NoLocks(int /*file*/) {
    return ENOLCK;
}

std::string OwnHost() {
    char name[256] = "";
    gethostname(name, sizeof name - 1);
    return name;
}

std::string LockText(const std::string& host, long process) {
    return "program: quorvan\nprocess: " + std::to_string(process) + "\nhost: " + host +
           "\nsince: 2026-11-22 14:03:07\n";
}

TEST(FolderLock, IsHeldByOneAndNamesItUntilReleased) {
    const TemporaryFolder folder;
    FolderLock first;
    ASSERT_EQ(first.Take(folder.Path(), "quorvan"), Outcome::Taken);
    const std::string text = folder.Read("Quorvan.lock");
    EXPECT_EQ(std::filesystem::status(folder.File("Quorvan.lock")).permissions(),
              std::filesystem::perms{0600});
    FolderLock second;
    EXPECT_EQ(second.Take(folder.Path(), "quorvan-cli", FolderLock::Doubt::PassOver), Outcome::Held);
    EXPECT_FALSE(second.IsTaken());
    EXPECT_EQ(second.Holder().program, "quorvan");
    EXPECT_EQ(second.Holder().process, getpid());
    EXPECT_EQ(second.Holder().host, OwnHost());
    EXPECT_EQ(second.Holder().since.size(), 19U);
    second.Release();
    EXPECT_EQ(folder.Read("Quorvan.lock"), text);
    first.Release();
    EXPECT_FALSE(folder.Has("Quorvan.lock"));
    EXPECT_EQ(second.Take(folder.Path(), "quorvan-cli"), Outcome::Taken);
    EXPECT_EQ(first.Take(folder.Path(), "quorvan"), Outcome::Held);
    EXPECT_EQ(first.Holder().program, "quorvan-cli");
}

TEST(FolderLock, OfAKilledProcessIsNoObstacle) {
    const TemporaryFolder folder;
    FolderLock lock;
    WaitingChild child([&] { static_cast<void>((new FolderLock)->Take(folder.Path(), "quorvan")); });
    EXPECT_EQ(lock.Take(folder.Path(), "quorvan"), Outcome::Held);
    EXPECT_EQ(lock.Holder().process, child.Id());
    child.Kill();
    EXPECT_NE(folder.Read("Quorvan.lock"), "");
    EXPECT_EQ(lock.Take(folder.Path(), "quorvan"), Outcome::Taken);
}

// A text left behind, and whether the lock is given in spite of it.
TEST(FolderLock, DoubtsWhatTheSystemsLockDoesNotTell) {
    WaitingChild ended([] {});
    ended.Kill();
    const std::string alive = LockText(OwnHost(), getpid());
    const struct {
        const char* what;
        FolderLock::LockCall call;
        std::string text;
        Outcome outcome;
    } cases[] = {
        {"another computer", FolderLock::LockBySystem, LockText("elsewhere", 17), Outcome::Doubtful},
        {"alive, but does not hold it", FolderLock::LockBySystem, alive, Outcome::Taken},
        {"cut off", FolderLock::LockBySystem, "program: quor", Outcome::Taken},
        {"long and binary", FolderLock::LockBySystem, std::string(100000, '\1'), Outcome::Taken},
        {"no locks, nobody", NoLocks, "", Outcome::Taken},
        {"no locks, alive", NoLocks, alive, Outcome::Doubtful},
        {"no locks, ended", NoLocks, LockText(OwnHost(), ended.Id()), Outcome::Taken},
        {"no locks, another computer", NoLocks, LockText("elsewhere", ended.Id()), Outcome::Doubtful},
    };
    for (const auto& each : cases) {
        SCOPED_TRACE(each.what);
        const TemporaryFolder folder;
        folder.Write("Quorvan.lock", each.text);
        FolderLock lock(each.call);
        EXPECT_EQ(lock.Take(folder.Path(), "quorvan"), each.outcome);
        EXPECT_EQ(lock.IsTaken(), each.outcome == Outcome::Taken);
        if (each.outcome == Outcome::Doubtful) {
            EXPECT_EQ(folder.Read("Quorvan.lock"), each.text);
            EXPECT_EQ(lock.Take(folder.Path(), "quorvan", FolderLock::Doubt::PassOver), Outcome::Taken);
        }
        EXPECT_NE(folder.Read("Quorvan.lock").find("host: " + OwnHost() + "\n"), std::string::npos);
        EXPECT_LT(folder.Read("Quorvan.lock").size(), 400U);
    }
}

TEST(FolderLock, DescribesItsHolderInOneLine) {
    EXPECT_EQ(DescribeHolder({}), "another program");
    EXPECT_EQ(DescribeHolder({"quorvan", 4711, "desk", "2026-11-22 14:03:07"}),
              "quorvan (process 4711 on the computer desk, since 2026-11-22 14:03:07)");
    const TemporaryFolder folder;
    folder.Write("Quorvan.lock", "program: " + std::string(500, 'x') + "\nhost: a\rb\nprocess: 5\n");
    FolderLock lock;
    ASSERT_EQ(lock.Take(folder.Path(), "quorvan"), Outcome::Doubtful);
    EXPECT_EQ(DescribeHolder(lock.Holder()), std::string(100, 'x') + " (process 5 on the computer a?b)");
}

TEST(FolderLock, FailsWhereItsFileCannotBe) {
    const TemporaryFolder folder;
    folder.Write("other", "text");
    const std::string path = folder.File("Quorvan.lock");
    const std::pair<const char*, std::function<void()>> cases[] = {
        {"folder", [&] { std::filesystem::create_directory(path); }},
        {"pipe", [&] { mkfifo(path.c_str(), 0600); }},
        {"link", [&] { std::filesystem::create_symlink(folder.File("other"), path); }}};
    for (const auto& [what, make] : cases) {
        make();
        FolderLock lock;
        EXPECT_EQ(lock.Take(folder.Path(), "quorvan"), Outcome::Failed) << what;
        EXPECT_EQ(lock.Error(), EINVAL) << what;
        EXPECT_TRUE(std::filesystem::remove(path)) << what;
    }
    EXPECT_EQ(folder.Read("other"), "text");
    FolderLock lock;
    EXPECT_EQ(lock.Take(folder.File("none"), "quorvan"), Outcome::Failed);
    EXPECT_EQ(lock.Error(), ENOENT);
}

TEST(FolderLock, InAFolderThatMayOnlyBeReadIsSeenAllTheSame) {
    const TemporaryFolder folder;
    std::filesystem::permissions(folder.Path(), std::filesystem::perms{0555});
    const auto take = [&] {
        FolderLock lock;
        const Outcome outcome = lock.Take(folder.Path(), "quorvan");
        if (outcome == Outcome::Held)
            return lock.Holder().process == getppid() ? 1 : 2;
        return outcome == Outcome::Failed ? 100 + lock.Error() : 3;
    };
    EXPECT_EQ(ResultAsOrdinaryUser(take), 100 + EACCES);
    EXPECT_EQ(ResultAsOrdinaryUser([&] { return TryWritingIn(folder.Path()); }), EACCES);
    if (getuid() != 0)
        std::filesystem::permissions(folder.Path(), std::filesystem::perms{0755});
    EXPECT_EQ(TryWritingIn(folder.Path()), 0);
    FolderLock lock;
    ASSERT_EQ(lock.Take(folder.Path(), "quorvan"), Outcome::Taken);
    std::filesystem::permissions(folder.File("Quorvan.lock"), std::filesystem::perms{0444});
    EXPECT_EQ(ResultAsOrdinaryUser(take), 1);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"Quorvan.lock"});
    lock.Release();
    folder.Write("Quorvan.lock", LockText(OwnHost(), getpid()));
    std::filesystem::permissions(folder.File("Quorvan.lock"), std::filesystem::perms{0444});
    EXPECT_EQ(ResultAsOrdinaryUser(take), 100 + EACCES) << "nobody holds it";
}

// Taking, releasing and removing the file must never leave two inside.
TEST(FolderLock, LetsOneOfManyInAtATime) {
    const TemporaryFolder folder;
    const std::string inside = folder.File("inside");
    const auto work = [&] {
        for (int done = 0; done < 300;) {
            FolderLock lock;
            if (lock.Take(folder.Path(), "quorvan") != Outcome::Taken)
                continue;
            const int file = open(inside.c_str(), O_CREAT | O_EXCL | O_WRONLY, 0600);
            if (file < 0)
                return 1;
            close(file);
            unlink(inside.c_str());
            ++done;
        }
        return 0;
    };
    pid_t children[4] = {};
    for (pid_t& child : children) {
        child = fork();
        if (child == 0)
            _exit(work());
    }
    for (const pid_t child : children) {
        int status = 0;
        waitpid(child, &status, 0);
        EXPECT_EQ(status, 0);
    }
    EXPECT_FALSE(folder.Has("Quorvan.lock"));
}

TEST(FolderProbe, FindsThatTheRoomEnds) {
    const TemporaryFolder folder;
    const auto tryInLittleRoom = [&] { // to the process the end of its room is that of a full disk
        const rlimit room{1000, 1000};
        setrlimit(RLIMIT_FSIZE, &room);
        return TryWritingIn(folder.Path());
    };
    EXPECT_EQ(ResultInChild(tryInLittleRoom), ENOSPC);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{});
}

} // namespace
