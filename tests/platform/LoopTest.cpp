// Loopers, semaphores and threads on a real application object.
#include <atomic>
#include <numeric>
#include <thread>

#include <poll.h>

#include "Stage.h"
#include "Worker.h"

namespace {

constexpr bigtime_t Hour = 3'600'000'000;

status_t WaitFor(sem_id sem, bigtime_t timeout = B_INFINITE_TIMEOUT) {
    return acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, timeout);
}

class Loopers : public StageTest {
  protected:
    Loopers() { window->Show(); }
    const sem_id sem = create_sem(0, "wait");
};

TEST_F(Loopers, HandleOneMessageAfterTheOtherWhileOthersGoOn) {
    Codes posted(50);
    std::iota(posted.begin(), posted.end(), 1);
    auto* other = new RecordingWindow({}, "other");
    other->Show();
    other->inside = [&](uint32) { delete_sem(sem); };
    window->inside = [&](uint32 code) {
        if (code == 1)
            EXPECT_EQ(WaitFor(sem), B_BAD_SEM_ID);
        EXPECT_EQ(window->received.size(), code) << "the second message must wait for the first's return";
    };
    std::thread([&] {
        for (const uint32 code : posted)
            window->PostMessage(code);
    }).join();
    other->PostMessage(7); // it is there already when the wait begins, and nothing comes after it
    EXPECT_EQ(Received(posted.size()), posted);
    EXPECT_EQ(other->received, Codes{7});
}

// As a window does whose worker ends while the application quits.
TEST_F(Loopers, AskedToQuitWhileItsDestructorWaitsItIsDestroyedOnce) {
    struct Waiting : BLooper {
        explicit Waiting(std::function<void()> w) : wait(std::move(w)) {}
        ~Waiting() override { wait(); }
        std::function<void()> wait;
    };
    int destroyed = 0;
    auto* waiting = new Waiting([&] {
        window->PostMessage(1);
        if (++destroyed == 1)
            WaitFor(sem);
    });
    window->inside = [&](uint32) {
        waiting->Quit();
        delete_sem(sem);
    };
    waiting->PostMessage(B_QUIT_REQUESTED);
    EXPECT_EQ(Received(1), Codes{1});
    EXPECT_EQ(destroyed, 1);
}

TEST_F(Loopers, LockIsRecursiveAndTimesOutForOthers) {
    ASSERT_TRUE(window->Lock() && window->Lock());
    std::atomic<status_t> whileHeld{B_OK}, afterwards{B_ERROR};
    const Worker worker([&] {
        whileHeld = window->LockWithTimeout(2000);
        afterwards = window->LockWithTimeout(Hour);
        window->Unlock();
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return whileHeld == B_TIMED_OUT; }));
    window->Unlock();
    EXPECT_TRUE(window->IsLocked());
    window->Unlock();
    EXPECT_FALSE(window->IsLocked());
    EXPECT_TRUE(QTest::qWaitFor([&] { return afterwards == B_OK; }));
}

TEST_F(Loopers, MessagesToWhatIsGoneAreDropped) {
    auto* handler = new BHandler("handler");
    const BMessenger toLooper(window);
    Codes handled;
    window->inside = [&](uint32 code) {
        handled.push_back(code);
        window->Quit();
    };
    window->PostMessage(1, handler);
    delete handler;
    window->PostMessage(2);
    ASSERT_TRUE(QTest::qWaitFor([&] { return !toLooper.IsValid(); }));
    EXPECT_EQ(handled, Codes{2});
    EXPECT_EQ(toLooper.SendMessage(BMessage(3)), B_BAD_VALUE);
    EXPECT_EQ(toLooper.LockTargetWithTimeout(1000), B_BAD_VALUE);
}

TEST_F(Loopers, SemaphoresCountTimeOutAndVanish) {
    const sem_id one = create_sem(1, "count");
    EXPECT_EQ(WaitFor(one, 0), B_OK);
    EXPECT_EQ(WaitFor(one, 0), B_WOULD_BLOCK);
    EXPECT_EQ(WaitFor(one, 5000), B_TIMED_OUT);
    EXPECT_EQ(delete_sem(one), B_OK);
    EXPECT_EQ(delete_sem(one), B_BAD_SEM_ID);
    EXPECT_EQ(WaitFor(one), B_BAD_SEM_ID);
    EXPECT_EQ(create_sem(-1, "bad"), B_BAD_VALUE);
}

// Somebody may wait for what a thread does at its end: also one that is stopped at once comes to it.
TEST_F(Loopers, AStopEndsEveryKindOfAThreadsWait) {
    const std::function<int32()> waits[] = {
        [] { return snooze(Hour); },
        [&] { return WaitFor(sem); },
        [] {
            pollfd stop{thread_stop_fd(), POLLIN, 0};
            return poll(&stop, 1, -1) == 1 ? B_INTERRUPTED : B_ERROR;
        },
    };
    constexpr int killed = 3, all = 100;
    std::atomic<int> interrupted{0};
    for (int i = 0; i < all; ++i) {
        std::atomic<bool> begun{i >= killed};
        const Worker worker([&] {
            begun = true;
            interrupted += waits[i % 3]() == B_INTERRUPTED && thread_stop_requested();
        });
        ASSERT_TRUE(QTest::qWaitFor([&] { return begun.load(); }));
        EXPECT_EQ(i < killed ? kill_thread(worker.Id()) : stop_thread(worker.Id()), B_OK);
        if (i < killed) {
            EXPECT_EQ(interrupted, i + 1);
            EXPECT_EQ(kill_thread(worker.Id()), B_BAD_THREAD_ID);
        }
    }
    EXPECT_EQ(interrupted, all);
    EXPECT_FALSE(thread_stop_requested());
    EXPECT_EQ(stop_thread(-1), B_BAD_THREAD_ID);
}

TEST(Application, KeepsTheDecimalPoint) {
    setenv("LC_ALL", "de_DE.UTF-8", 1);
    const BApplication application("test");
    EXPECT_EQ(localeconv()->decimal_point, std::string("."));
}

} // namespace
