#include "platform/Kernel.h"

#include <atomic>
#include <cstring>
#include <map>
#include <memory>
#include <string>
#include <system_error>
#include <thread>

#include <pthread.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include "platform/private/ApplicationPeer.h"
#include "platform/private/Loop.h"

namespace {

constexpr std::size_t ThreadNameLimit = 15; // what the system keeps of a thread's name

// All of these are changed inside ChangeKernelState and looked at under the same lock.
struct Semaphore {
    int32 count = 0;
    bool deleted = false;
};

struct Thread {
    Thread(thread_func f, const char* n, void* d) : function(f), name(n ? n : ""), data(d) {
        stopFd = eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
    }
    ~Thread() {
        if (stopFd >= 0)
            close(stopFd);
    }
    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;

    thread_func function;
    std::string name;
    void* data;
    int stopFd;
    std::atomic<bool> stopRequested{false};
    bool started = false;
    bool finished = false;
};

std::map<sem_id, std::shared_ptr<Semaphore>> gSemaphores;
std::map<thread_id, std::shared_ptr<Thread>> gThreads;
int32 gLastId = 0;

thread_local Thread* tCurrentThread = nullptr;

std::shared_ptr<Semaphore> FindSemaphore(sem_id sem) {
    std::shared_ptr<Semaphore> found;
    LookAtKernelState([&] {
        const auto entry = gSemaphores.find(sem);
        if (entry != gSemaphores.end())
            found = entry->second;
    });
    return found;
}

std::shared_ptr<Thread> FindThread(thread_id thread) {
    std::shared_ptr<Thread> found;
    LookAtKernelState([&] {
        const auto entry = gThreads.find(thread);
        if (entry != gThreads.end())
            found = entry->second;
    });
    return found;
}

void RunThread(const std::shared_ptr<Thread>& thread, thread_id id) {
    tCurrentThread = thread.get();
    pthread_setname_np(pthread_self(), thread->name.substr(0, ThreadNameLimit).c_str());
    WaitUntil([&] { return thread->started; }, B_INFINITE_TIMEOUT);
    // Once it was resumed it runs, even if it is asked to stop before it comes to that: somebody may wait for
    // what it does at its end.
    bool started = false;
    LookAtKernelState([&] { started = thread->started; });
    if (started)
        thread->function(thread->data);
    tCurrentThread = nullptr;
    ChangeKernelState([&] {
        thread->finished = true;
        gThreads.erase(id);
    });
}

void RequestStop(Thread& thread) {
    ChangeKernelState([&] { thread.stopRequested = true; });
    const std::uint64_t one = 1;
    [[maybe_unused]] const auto written = write(thread.stopFd, &one, sizeof one);
}

} // namespace

sem_id create_sem(int32 count, const char*) {
    if (count < 0)
        return B_BAD_VALUE;
    sem_id id = 0;
    ChangeKernelState([&] {
        id = ++gLastId;
        gSemaphores[id] = std::make_shared<Semaphore>(Semaphore{count, false});
    });
    return id;
}

status_t delete_sem(sem_id sem) {
    status_t status = B_BAD_SEM_ID;
    ChangeKernelState([&] {
        const auto entry = gSemaphores.find(sem);
        if (entry == gSemaphores.end())
            return;
        entry->second->deleted = true;
        gSemaphores.erase(entry);
        status = B_OK;
    });
    return status;
}

status_t acquire_sem_etc(sem_id sem, int32 count, uint32, bigtime_t timeout) {
    const std::shared_ptr<Semaphore> semaphore = FindSemaphore(sem);
    if (!semaphore)
        return B_BAD_SEM_ID;
    // The condition takes the count itself, so that of two waiters only one gets it.
    bool taken = false;
    const auto obtain = [&, semaphore] {
        if (!taken && !semaphore->deleted && semaphore->count >= count) {
            semaphore->count -= count;
            taken = true;
        }
        return taken || semaphore->deleted;
    };
    const status_t status = WaitUntil(obtain, timeout);
    if (taken)
        return B_OK;
    if (status == B_OK)
        return B_BAD_SEM_ID;
    return status == B_TIMED_OUT && timeout <= 0 ? B_WOULD_BLOCK : status;
}

thread_id spawn_thread(thread_func function, const char* name, int32, void* data) {
    const auto thread = std::make_shared<Thread>(function, name, data);
    if (thread->stopFd < 0)
        return B_NO_MEMORY;
    thread_id id = 0;
    ChangeKernelState([&] {
        id = ++gLastId;
        gThreads[id] = thread;
    });
    try {
        std::thread(RunThread, thread, id).detach();
    } catch (const std::system_error&) {
        ChangeKernelState([&] { gThreads.erase(id); });
        return B_NO_MEMORY;
    }
    return id;
}

status_t resume_thread(thread_id thread) {
    const std::shared_ptr<Thread> found = FindThread(thread);
    if (!found)
        return B_BAD_THREAD_ID;
    ChangeKernelState([&] { found->started = true; });
    return B_OK;
}

status_t kill_thread(thread_id thread) {
    const std::shared_ptr<Thread> found = FindThread(thread);
    if (!found)
        return B_BAD_THREAD_ID;
    RequestStop(*found);
    return WaitUntil([&] { return found->finished; }, B_INFINITE_TIMEOUT);
}

status_t stop_thread(thread_id thread) {
    const std::shared_ptr<Thread> found = FindThread(thread);
    if (!found)
        return B_BAD_THREAD_ID;
    RequestStop(*found);
    return B_OK;
}

bool thread_stop_requested() {
    return tCurrentThread && tCurrentThread->stopRequested;
}

int thread_stop_fd() {
    return tCurrentThread ? tCurrentThread->stopFd : -1;
}

status_t snooze(bigtime_t microseconds) {
    const status_t status = WaitUntil([] { return false; }, microseconds);
    return status == B_TIMED_OUT ? B_OK : status;
}

void StopAllThreads(bigtime_t patience) {
    std::map<thread_id, std::shared_ptr<Thread>> threads;
    LookAtKernelState([&] { threads = gThreads; });
    for (const auto& [id, thread] : threads)
        RequestStop(*thread);
    WaitUntil([] { return gThreads.empty(); }, patience);
}
