#pragma once

// How the interface thread serves loopers and waits. Only for the layer's own sources.

#include <functional>

#include "platform/Looper.h"

class QDialog;

// Whether the calling thread is the interface thread.
bool OnInterfaceThread();

// Runs work on the interface thread, soon; from any thread. Dropped when the application ends first.
void RunOnInterfaceThread(std::function<void()> work);

// Runs work on the interface thread and waits for its end: at once when already there. Returns false, with
// the work left undone or still under way, when the calling thread is asked to stop; work must therefore own
// what it uses.
bool CallOnInterfaceThread(std::function<void()> work);

// Waits until condition holds: B_OK, or B_TIMED_OUT after timeout microseconds, or B_INTERRUPTED when the
// calling thread is asked to stop. condition is called with the kernel's own lock held, must be quick, and
// may call nothing of the layer; whoever changes what it looks at does so inside ChangeKernelState. On the
// interface thread the toolkit's loop runs meanwhile.
status_t WaitUntil(const std::function<bool()>& condition, bigtime_t timeout);

// Runs change with the kernel's lock held, then has every wait look again.
void ChangeKernelState(const std::function<void()>& change);

// Runs look with the kernel's lock held.
void LookAtKernelState(const std::function<void()>& look);

// Holds a looper's lock for a paint pass or an event; null for none.
class InterfaceLock {
  public:
    explicit InterfaceLock(BLooper* looper);
    ~InterfaceLock();
    InterfaceLock(const InterfaceLock&) = delete;
    InterfaceLock& operator=(const InterfaceLock&) = delete;

  private:
    BLooper* looper_;
};

// Makes message the looper's current one while it lives, for hooks that are called straight from an event.
class CurrentMessageScope {
  public:
    CurrentMessageScope(BLooper* looper, BMessage* message);
    ~CurrentMessageScope();
    CurrentMessageScope(const CurrentMessageScope&) = delete;
    CurrentMessageScope& operator=(const CurrentMessageScope&) = delete;

  private:
    BLooper* looper_;
    BMessage* outer_;
};

// Shows a toolkit dialog and waits for its end, with the other loopers served. Returns its result;
// QDialog::Rejected also when the application quits meanwhile, or when cancelled (may be null) tells so while
// waiting.
int RunDialog(QDialog& dialog, const std::function<bool()>& cancelled = nullptr);

// How many waits of the interface thread are under way, one inside the other.
int CountInterfaceWaits();
// Ends the innermost dialog shown by RunDialog as if it was cancelled; false when none is open.
bool RejectInnermostDialog();

// The application object's side: the interface thread begins and ends to serve.
void OpenInterfaceThread();
void CloseInterfaceThread();
