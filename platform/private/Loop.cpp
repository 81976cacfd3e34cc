#include "platform/private/Loop.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include <QApplication>
#include <QDialog>
#include <QEventLoop>
#include <QPointer>
#include <QTimer>

#include "platform/Kernel.h"
#include "platform/private/LooperCore.h"
#include "platform/private/Placement.h"

namespace {

constexpr int CancelPollMilliseconds = 50;

std::mutex gPostMutex;              // guards the receiver and what is handed over to it
std::unique_ptr<QObject> gReceiver; // of work, while there is an interface thread
std::atomic<std::thread::id> gInterfaceThread;

// One lock for all semaphores and thread states: they are few, and waits on them rare.
std::mutex gKernelMutex;
std::condition_variable gKernelChanged;

// A wait of the interface thread. Innermost last; the outer ones can only end after it.
struct InterfaceWait {
    const std::function<bool()>* condition;
    QEventLoop* loop;
};
std::vector<InterfaceWait> gInterfaceWaits; // interface thread only
std::vector<QDialog*> gOpenDialogs;         // interface thread only
int gWaitDepth = 0;                         // interface thread only

void CheckInterfaceWaits() {
    const std::lock_guard guard(gKernelMutex);
    for (const InterfaceWait& wait : gInterfaceWaits)
        if ((*wait.condition)())
            wait.loop->quit();
}

status_t WaitOnInterfaceThread(const std::function<bool()>& condition, bigtime_t timeout) {
    const auto holds = [&] {
        const std::lock_guard guard(gKernelMutex);
        return condition();
    };
    if (holds())
        return B_OK;
    if (timeout <= 0)
        return B_TIMED_OUT;
    QEventLoop loop;
    QTimer timer;
    timer.setSingleShot(true);
    QObject::connect(&timer, &QTimer::timeout, &loop, &QEventLoop::quit);
    if (timeout != B_INFINITE_TIMEOUT)
        timer.start(std::chrono::milliseconds((timeout + 999) / 1000));
    gInterfaceWaits.push_back({&condition, &loop});
    ++gWaitDepth;
    // What is in the toolkit's queue already, a change's notice among it, may be served only behind something
    // new.
    RunOnInterfaceThread(CheckInterfaceWaits);
    loop.exec();
    --gWaitDepth;
    gInterfaceWaits.pop_back();
    return holds() ? B_OK : B_TIMED_OUT;
}

status_t WaitOnWorker(const std::function<bool()>& condition, bigtime_t timeout) {
    std::unique_lock guard(gKernelMutex);
    const auto done = [&] { return condition() || thread_stop_requested(); };
    if (timeout == B_INFINITE_TIMEOUT)
        gKernelChanged.wait(guard, done);
    else if (!gKernelChanged.wait_for(guard, std::chrono::microseconds(timeout), done))
        return B_TIMED_OUT;
    return condition() ? B_OK : B_INTERRUPTED;
}

} // namespace

bool OnInterfaceThread() {
    return std::this_thread::get_id() == gInterfaceThread.load();
}

void RunOnInterfaceThread(std::function<void()> work) {
    const std::lock_guard guard(gPostMutex);
    if (!gReceiver)
        return;
    auto run = [work = std::move(work)] {
        // Thread checkers do not see the toolkit's locks; ours tells them that work was handed over.
        gPostMutex.lock();
        gPostMutex.unlock();
        work();
    };
    QMetaObject::invokeMethod(gReceiver.get(), std::move(run), Qt::QueuedConnection);
}

bool CallOnInterfaceThread(std::function<void()> work) {
    if (OnInterfaceThread()) {
        work();
        return true;
    }
    const auto finished = std::make_shared<bool>(false);
    RunOnInterfaceThread([work = std::move(work), finished] {
        work();
        ChangeKernelState([&] { *finished = true; });
    });
    return WaitUntil([finished] { return *finished; }, B_INFINITE_TIMEOUT) == B_OK;
}

status_t WaitUntil(const std::function<bool()>& condition, bigtime_t timeout) {
    return OnInterfaceThread() ? WaitOnInterfaceThread(condition, timeout) : WaitOnWorker(condition, timeout);
}

void ChangeKernelState(const std::function<void()>& change) {
    {
        const std::lock_guard guard(gKernelMutex);
        change();
        gKernelChanged.notify_all();
    }
    RunOnInterfaceThread(CheckInterfaceWaits);
}

void LookAtKernelState(const std::function<void()>& look) {
    const std::lock_guard guard(gKernelMutex);
    look();
}

InterfaceLock::InterfaceLock(BLooper* looper) : looper_(looper) {
    if (looper_)
        looper_->Lock();
}

InterfaceLock::~InterfaceLock() {
    if (looper_)
        looper_->Unlock();
}

CurrentMessageScope::CurrentMessageScope(BLooper* looper, BMessage* message)
    : looper_(looper), outer_(looper ? looper->CurrentMessage() : nullptr) {
    if (looper_)
        LooperAccess::Core(*looper_).SetCurrent(message);
}

CurrentMessageScope::~CurrentMessageScope() {
    if (looper_)
        LooperAccess::Core(*looper_).SetCurrent(outer_);
}

int RunDialog(QDialog& dialog, const std::function<bool()>& cancelled) {
    QTimer poll;
    if (cancelled) {
        QObject::connect(&poll, &QTimer::timeout, &dialog, [&] {
            if (cancelled())
                dialog.reject();
        });
        poll.start(CancelPollMilliseconds);
    }
    // Not every window manager gives the keyboard back to where it was.
    const QPointer<QWidget> before = WindowBelow();
    PlaceDialog(dialog, before);
    gOpenDialogs.push_back(&dialog);
    ++gWaitDepth;
    const int result = dialog.exec();
    --gWaitDepth;
    gOpenDialogs.pop_back();
    if (before)
        before->activateWindow();
    return result;
}

int CountInterfaceWaits() {
    return gWaitDepth;
}

bool RejectInnermostDialog() {
    if (gOpenDialogs.empty())
        return false;
    gOpenDialogs.back()->reject();
    return true;
}

void OpenInterfaceThread() {
    gInterfaceThread = std::this_thread::get_id();
    const std::lock_guard guard(gPostMutex);
    gReceiver = std::make_unique<QObject>();
}

void CloseInterfaceThread() {
    const std::lock_guard guard(gPostMutex);
    gReceiver.reset();
    gInterfaceThread = std::thread::id();
}
