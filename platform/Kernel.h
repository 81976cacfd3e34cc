#pragma once

// Semaphores, threads and sleeping. Every call here may be made from any thread.

#include "platform/Types.h"

using sem_id = int32;
using thread_id = int32;

// Creates a counting semaphore with the given count. Returns its id (above 0) or B_BAD_VALUE for a negative
// count.
sem_id create_sem(int32 count, const char* name);
// Deletes it; whoever waits on it wakes at once with B_BAD_SEM_ID. B_OK, or B_BAD_SEM_ID when there is no
// such one.
status_t delete_sem(sem_id sem);

constexpr uint32 B_RELATIVE_TIMEOUT = 8;
// Takes count, waiting at most timeout microseconds from now (flags B_RELATIVE_TIMEOUT; no other flag is
// known). B_OK; B_BAD_SEM_ID when the semaphore does not exist or is deleted meanwhile; B_TIMED_OUT
// (B_WOULD_BLOCK when timeout is 0 or less); B_INTERRUPTED when the calling thread was asked to stop, or the
// application quits. On the interface thread the wait keeps all windows painted and other loopers served.
status_t acquire_sem_etc(sem_id sem, int32 count, uint32 flags, bigtime_t timeout);

using thread_func = int32 (*)(void* data);

// The priority for an ordinary task.
constexpr int32 suggest_thread_priority() {
    return 10;
}

// Prepares a thread that will run function(data); it starts with resume_thread. Returns its id (above 0), or
// B_NO_MEMORY when no thread can be made. Priorities are advice; ordinary programs may not raise theirs.
thread_id spawn_thread(thread_func function, const char* name, int32 priority, void* data);
status_t resume_thread(thread_id thread);
// Asks the thread to stop and waits for its end. B_OK, or B_BAD_THREAD_ID when there is no such thread (any
// more). On the interface thread the wait keeps all windows painted. Nothing is ever torn down by force: the
// thread's waits in this header end at once with B_INTERRUPTED, thread_stop_fd becomes readable, and the
// thread's own code is expected to look at thread_stop_requested between steps and return.
status_t kill_thread(thread_id thread);

// Asks the thread to stop in the same way and returns at once. B_OK, or B_BAD_THREAD_ID.
status_t stop_thread(thread_id thread);

// Whether the calling thread was asked to stop; false on threads that spawn_thread did not make.
bool thread_stop_requested();
// A file descriptor that becomes readable when the calling thread is asked to stop, to be polled beside a
// socket; -1 on threads that spawn_thread did not make. It belongs to the thread and must not be closed.
int thread_stop_fd();

// Sleeps for the given microseconds. B_OK, or B_INTERRUPTED when the thread is asked to stop.
status_t snooze(bigtime_t microseconds);
