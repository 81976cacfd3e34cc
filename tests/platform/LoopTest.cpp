// Loopers, semaphores and threads on a real application object.
#include <atomic>
#include <numeric>
#include <string>
#include <vector>

#include <QTest>
#include <QTimer>
#include <gtest/gtest.h>
#include <poll.h>

#include "Worker.h"
#include "platform/Application.h"

namespace {

constexpr bigtime_t kSecond = 1000000;

status_t WaitFor(sem_id sem) {
    return acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, B_INFINITE_TIMEOUT);
}

using Log = std::vector<uint32>;

// Notes what it receives; then runs what a test gives it inside the handler.
class Recorder : public BLooper {
  public:
    explicit Recorder(Log& log) : log_(log) {}

    void MessageReceived(BMessage* message) override {
        log_.push_back(message->what);
        if (inside)
            inside(message->what);
    }

    std::function<void(uint32)> inside;

  private:
    Log& log_;
};

class Loopers : public testing::Test {
  protected:
    ~Loopers() override {
        for (Recorder* recorder : {first_, second_})
            if (recorder)
                recorder->Quit();
    }

    BApplication application_{"test"};
    Log log_, otherLog_;
    Recorder* first_ = new Recorder(log_);
    Recorder* second_ = new Recorder(otherLog_);
};

TEST_F(Loopers, HandleMessagesInOrderAlsoWhenPostedFromAWorker) {
    Log posted(50);
    std::iota(posted.begin(), posted.end(), 1);
    const Worker worker([&] {
        for (const uint32 code : posted)
            first_->PostMessage(code);
    });
    EXPECT_TRUE(QTest::qWaitFor([&] { return log_ == posted; }));
}

TEST_F(Loopers, AWaitingHandlerHoldsBackItsOwnMessagesOnly) {
    const sem_id sem = create_sem(0, "wait");
    Log seenWhileWaiting;
    status_t waited = B_OK;
    first_->inside = [&](uint32 code) {
        if (code != 1)
            return;
        waited = WaitFor(sem);
        seenWhileWaiting = log_;
    };
    second_->inside = [&](uint32) { delete_sem(sem); };
    first_->PostMessage(1);
    first_->PostMessage(2);
    QTimer::singleShot(
        20, [&] { second_->PostMessage(7); });
    ASSERT_TRUE(QTest::qWaitFor([&] { return log_.size() == 2; }));
    EXPECT_EQ(waited, B_BAD_SEM_ID);
    EXPECT_EQ(seenWhileWaiting, Log{1}) << "the second message must wait for the first handler's return";
    EXPECT_EQ(otherLog_, Log{7});
}

// As a window does whose worker ends while the application quits.
TEST_F(Loopers, AskedToQuitWhileItsDestructorWaitsItIsDestroyedOnce) {
    class Waiting : public BLooper {
      public:
        Waiting(std::function<void()> wait, int& destroyed) : wait_(std::move(wait)), destroyed_(destroyed) {}
        ~Waiting() override {
            if (++destroyed_ == 1)
                wait_();
        }

      private:
        std::function<void()> wait_;
        int& destroyed_;
    };
    const sem_id sem = create_sem(0, "wait");
    const auto wait = [&] {
        second_->PostMessage(1);
        WaitFor(sem);
    };
    int destroyed = 0;
    auto* waiting = new Waiting(wait, destroyed);
    second_->inside = [&](uint32) {
        waiting->Quit();
        delete_sem(sem);
    };
    waiting->PostMessage(B_QUIT_REQUESTED);
    EXPECT_TRUE(QTest::qWaitFor([&] { return otherLog_ == Log{1}; }));
    EXPECT_EQ(destroyed, 1);
}

TEST_F(Loopers, LockIsRecursiveAndTimesOutForOthers) {
    ASSERT_TRUE(first_->Lock() && first_->Lock());
    std::atomic<status_t> whileHeld{B_OK}, afterwards{B_ERROR};
    const Worker worker([&] {
        whileHeld = first_->LockWithTimeout(2000);
        afterwards = first_->LockWithTimeout(10 * kSecond);
        first_->Unlock();
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return whileHeld == B_TIMED_OUT; }));
    first_->Unlock();
    EXPECT_TRUE(first_->IsLocked());
    first_->Unlock();
    EXPECT_FALSE(first_->IsLocked());
    EXPECT_TRUE(QTest::qWaitFor([&] { return afterwards == B_OK; }));
}

TEST_F(Loopers, MessagesToWhatIsGoneAreDropped) {
    auto* handler = new BHandler("handler");
    const BMessenger toLooper(first_);
    first_->PostMessage(1, handler);
    delete handler;
    first_->PostMessage(2);
    first_->inside = [&](uint32) { std::exchange(first_, nullptr)->Quit(); };
    ASSERT_TRUE(QTest::qWaitFor([&] { return !toLooper.IsValid(); }));
    EXPECT_EQ(log_, Log{2});
    EXPECT_EQ(toLooper.SendMessage(BMessage(3)), B_BAD_VALUE);
    EXPECT_EQ(toLooper.LockTargetWithTimeout(1000), B_BAD_VALUE);
}

TEST(Semaphores, CountTimeOutAndVanish) {
    const BApplication application("test");
    const sem_id sem = create_sem(1, "count");
    EXPECT_EQ(acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, 0), B_OK);
    EXPECT_EQ(acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, 0), B_WOULD_BLOCK);
    EXPECT_EQ(acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, 5000), B_TIMED_OUT);
    EXPECT_EQ(delete_sem(sem), B_OK);
    EXPECT_EQ(delete_sem(sem), B_BAD_SEM_ID);
    EXPECT_EQ(WaitFor(sem), B_BAD_SEM_ID);
    EXPECT_EQ(create_sem(-1, "bad"), B_BAD_VALUE);
}

TEST(Threads, KillEndsEveryKindOfWait) {
    const BApplication application("test");
    const sem_id sem = create_sem(0, "never");
    const std::function<int32()> waits[] = {
        [] { return snooze(3600 * kSecond); },
        [sem] { return WaitFor(sem); },
        [] {
            pollfd stop{thread_stop_fd(), POLLIN, 0};
            return poll(&stop, 1, -1) == 1 ? B_INTERRUPTED : B_ERROR;
        },
    };
    for (const auto& wait : waits) {
        std::atomic<status_t> result{B_OK};
        std::atomic<bool> begun{false};
        const Worker worker([&] {
            begun = true;
            result = wait();
        });
        ASSERT_TRUE(QTest::qWaitFor([&] { return begun.load(); }));
        EXPECT_EQ(kill_thread(worker.Id()), B_OK);
        EXPECT_EQ(result, B_INTERRUPTED) << &wait - waits;
        EXPECT_EQ(kill_thread(worker.Id()), B_BAD_THREAD_ID);
    }
    EXPECT_FALSE(thread_stop_requested());

    delete_sem(sem);
}

// Somebody may wait for what it does at its end.
TEST(Threads, RunOnceResumedEvenIfStoppedAtOnce) {
    const BApplication application("test");
    constexpr int all = 100;
    std::atomic<int> stopped{0};
    for (int i = 0; i < all; ++i) {
        const Worker worker([&] {
            EXPECT_EQ(snooze(3600 * kSecond), B_INTERRUPTED);
            stopped += thread_stop_requested();
        });
        EXPECT_EQ(stop_thread(worker.Id()), B_OK);
    }
    EXPECT_EQ(stopped, all);
    EXPECT_EQ(stop_thread(-1), B_BAD_THREAD_ID);
}

TEST(Application, KeepsTheDecimalPoint) {
    setenv("LC_ALL", "de_DE.UTF-8", 1);
    const BApplication application("test");
    EXPECT_EQ(localeconv()->decimal_point, std::string("."));
}

} // namespace
