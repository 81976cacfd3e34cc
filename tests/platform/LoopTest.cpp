// Loopers, semaphores and threads on a real application object.
#include <atomic>
#include <string>
#include <vector>

#include <QTest>
#include <QTimer>
#include <gtest/gtest.h>
#include <poll.h>

#include "platform/Application.h"
#include "platform/Kernel.h"
#include "platform/Window.h"

namespace {

constexpr bigtime_t kSecond = 1000000;

// Notes what it receives; runs what a test gives it inside the handler.
class Recorder : public BLooper {
  public:
    explicit Recorder(std::vector<uint32>& log) : log_(log) {}

    void MessageReceived(BMessage* message) override {
        log_.push_back(message->what);
        if (inside)
            inside(message);
        BLooper::MessageReceived(message);
    }

    std::function<void(BMessage*)> inside;

  private:
    std::vector<uint32>& log_;
};

// A worker that does one thing; its result is there after Join.
class Worker {
  public:
    explicit Worker(std::function<int32()> work) : work_(std::move(work)) {
        id_ = spawn_thread([](void* data) { return static_cast<Worker*>(data)->work_(); }, "worker",
                           suggest_thread_priority(), this);
        resume_thread(id_);
    }
    thread_id Id() const { return id_; }

  private:
    std::function<int32()> work_;
    thread_id id_;
};

} // namespace

TEST(Loopers, HandleMessagesInOrderAlsoWhenPostedFromAWorker) {
    BApplication application("test");
    std::vector<uint32> log;
    auto* looper = new Recorder(log);
    Worker worker([&] {
        for (uint32 code = 1; code <= 200; code++)
            looper->PostMessage(code);
        return 0;
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return log.size() == 200; }));
    for (uint32 code = 1; code <= 200; code++)
        EXPECT_EQ(log[code - 1], code);
    looper->Quit();
}

TEST(Loopers, AWaitingHandlerHoldsBackItsOwnMessagesOnly) {
    BApplication application("test");
    std::vector<uint32> waiting;
    std::vector<uint32> other;
    auto* first = new Recorder(waiting);
    auto* second = new Recorder(other);
    const sem_id sem = create_sem(0, "wait");
    std::size_t seenWhileWaiting = 0;
    status_t waited = B_OK;
    first->inside = [&](BMessage* message) {
        if (message->what != 1)
            return;
        waited = acquire_sem(sem);
        seenWhileWaiting = waiting.size();
    };
    second->inside = [&](BMessage*) { delete_sem(sem); };
    first->PostMessage(1);
    first->PostMessage(2);
    QTimer::singleShot(20, [&] { second->PostMessage(7); });
    ASSERT_TRUE(QTest::qWaitFor([&] { return waiting.size() == 2; }));
    EXPECT_EQ(waited, B_BAD_SEM_ID);
    EXPECT_EQ(seenWhileWaiting, 1U) << "the second message must wait for the first handler's return";
    EXPECT_EQ(other, std::vector<uint32>{7});
    first->Quit();
    second->Quit();
}

TEST(Loopers, LockIsRecursiveAndTimesOutForOthers) {
    BApplication application("test");
    std::vector<uint32> log;
    auto* looper = new Recorder(log);
    ASSERT_TRUE(looper->Lock());
    ASSERT_TRUE(looper->Lock());
    std::atomic<int> tried{0};
    std::atomic<status_t> whileHeld{B_OK};
    std::atomic<status_t> afterwards{B_ERROR};
    Worker worker([&] {
        whileHeld = looper->LockWithTimeout(2000);
        tried = 1;
        afterwards = looper->LockWithTimeout(10 * kSecond);
        looper->Unlock();
        tried = 2;
        return 0;
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return tried == 1; }));
    EXPECT_EQ(whileHeld, B_TIMED_OUT);
    looper->Unlock();
    EXPECT_TRUE(looper->IsLocked());
    looper->Unlock();
    EXPECT_FALSE(looper->IsLocked());
    ASSERT_TRUE(QTest::qWaitFor([&] { return tried == 2; }));
    EXPECT_EQ(afterwards, B_OK);
    looper->Quit();
}

TEST(Loopers, AMessageWaitsWhileAWorkerHoldsTheLockAndTheInterfaceGoesOn) {
    BApplication application("test");
    std::vector<uint32> log;
    std::vector<uint32> free;
    auto* held = new Recorder(log);
    auto* other = new Recorder(free);
    const sem_id release = create_sem(0, "release");
    std::atomic<bool> locked{false};
    Worker worker([&] {
        held->Lock();
        locked = true;
        acquire_sem(release);
        held->Unlock();
        return 0;
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return locked.load(); }));
    held->PostMessage(1);
    other->PostMessage(2);
    ASSERT_TRUE(QTest::qWaitFor([&] { return free.size() == 1; }));
    EXPECT_TRUE(log.empty());
    release_sem(release);
    EXPECT_TRUE(QTest::qWaitFor([&] { return log.size() == 1; }));
    delete_sem(release);
    held->Quit();
    other->Quit();
}

TEST(Loopers, MessagesToWhatIsGoneAreDropped) {
    BApplication application("test");
    std::vector<uint32> log;
    auto* looper = new Recorder(log);
    auto* handler = new BHandler("handler");
    const BMessenger toLooper(looper);
    looper->PostMessage(1, handler);
    delete handler;
    looper->PostMessage(2);
    looper->inside = [&](BMessage*) { looper->Quit(); };
    ASSERT_TRUE(QTest::qWaitFor([&] { return !toLooper.IsValid(); }));
    EXPECT_EQ(log, std::vector<uint32>{2});
    EXPECT_EQ(toLooper.SendMessage(BMessage(3)), B_BAD_VALUE);
    EXPECT_EQ(toLooper.LockTargetWithTimeout(1000), B_BAD_VALUE);
}

TEST(Semaphores, CountTimeOutAndVanish) {
    BApplication application("test");
    const sem_id sem = create_sem(1, "count");
    EXPECT_EQ(acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, 0), B_OK);
    EXPECT_EQ(acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, 0), B_WOULD_BLOCK);
    EXPECT_EQ(acquire_sem_etc(sem, 1, B_RELATIVE_TIMEOUT, 5000), B_TIMED_OUT);
    EXPECT_EQ(release_sem(sem), B_OK);
    EXPECT_EQ(acquire_sem(sem), B_OK);
    EXPECT_EQ(delete_sem(sem), B_OK);
    EXPECT_EQ(delete_sem(sem), B_BAD_SEM_ID);
    EXPECT_EQ(acquire_sem(sem), B_BAD_SEM_ID);
    EXPECT_EQ(create_sem(-1, "bad"), B_BAD_VALUE);
}

TEST(Threads, KillEndsEveryKindOfWaitAndThreadsReturnTheirResults) {
    BApplication application("test");
    const sem_id sem = create_sem(0, "never");
    std::atomic<int> begun{0};
    std::atomic<status_t> slept{B_OK};
    std::atomic<status_t> acquired{B_OK};
    std::atomic<int> polled{0};
    const auto begin = [&] { begun++; };
    Worker sleeper([&] {
        begin();
        slept = snooze(3600 * kSecond);
        return 0;
    });
    Worker acquirer([&] {
        begin();
        acquired = acquire_sem(sem);
        return 0;
    });
    Worker poller([&] {
        begin();
        pollfd stop{thread_stop_fd(), POLLIN, 0};
        polled = poll(&stop, 1, -1);
        return 0;
    });
    ASSERT_TRUE(QTest::qWaitFor([&] { return begun == 3; }));
    for (const Worker* worker : {&sleeper, &acquirer, &poller})
        EXPECT_EQ(kill_thread(worker->Id()), B_OK);
    EXPECT_EQ(slept, B_INTERRUPTED);
    EXPECT_EQ(acquired, B_INTERRUPTED);
    EXPECT_EQ(polled, 1);
    EXPECT_EQ(kill_thread(sleeper.Id()), B_BAD_THREAD_ID);
    EXPECT_FALSE(thread_stop_requested());

    std::atomic<bool> go{false};
    Worker answer([&] {
        while (!go)
            snooze(1000);
        return 42;
    });
    QTimer::singleShot(10, [&] { go = true; });
    int32 result = 0;
    EXPECT_EQ(wait_for_thread(answer.Id(), &result), B_OK);
    EXPECT_EQ(result, 42);
    delete_sem(sem);
}

TEST(Application, QuitsFromInsideADialogsWaitAndKeepsTheDecimalPoint) {
    setenv("LC_ALL", "de_DE.UTF-8", 1);
    BApplication application("test");
    EXPECT_EQ(localeconv()->decimal_point, std::string("."));
    class Waiting : public BWindow {
      public:
        Waiting(sem_id sem, bool& returned)
            : BWindow(BRect(0, 0, 50, 50), "waiting", B_TITLED_WINDOW, 0), sem_(sem), returned_(returned) {}
        void MessageReceived(BMessage* message) override {
            if (message->what != 1) {
                BWindow::MessageReceived(message);
                return;
            }
            while (acquire_sem_etc(sem_, 1, B_RELATIVE_TIMEOUT, 50000) != B_BAD_SEM_ID)
                UpdateIfNeeded();
            returned_ = true;
        }

      private:
        sem_id sem_;
        bool& returned_;
    };
    // As a modal dialog does, the window takes the semaphore with it.
    class Modal : public BWindow {
      public:
        explicit Modal(sem_id sem)
            : BWindow(BRect(0, 0, 50, 50), "modal", B_FLOATING_WINDOW_LOOK, B_MODAL_APP_WINDOW_FEEL, 0),
              sem_(sem) {}
        ~Modal() override { delete_sem(sem_); }

      private:
        sem_id sem_;
    };
    const sem_id sem = create_sem(0, "modal");
    bool returned = false;
    auto* window = new Waiting(sem, returned);
    window->Show();
    (new Modal(sem))->Show();
    EXPECT_EQ(application.CountWindows(), 2);
    window->PostMessage(1);
    QTimer::singleShot(50, [&] { application.PostMessage(B_QUIT_REQUESTED); });
    application.Run();
    EXPECT_TRUE(returned);
    EXPECT_EQ(application.CountWindows(), 0);
}
