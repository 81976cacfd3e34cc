// How the interface thread serves loopers and waits. Only for the layer's own sources.
#pragma once

#include <functional>

#include "platform/Looper.h"

class QDialog;
class QObject;

// Whether the calling thread is the interface thread.
bool OnInterfaceThread();

// Runs work on the interface thread, soon; from any thread. Dropped when context (which lives on the
// interface thread) dies first; null context: the application.
void RunOnInterfaceThread(std::function<void()> work, QObject* context = nullptr);

// Runs work on the interface thread and waits for its end: at once when already there. Returns false, with
// the work left undone or still under way, when the calling thread is asked to stop or the application quits;
// work must therefore own what it uses.
bool CallOnInterfaceThread(std::function<void()> work);

// Holds a looper's lock for a paint pass or an event if it can be had within a few milliseconds: the
// interface thread never waits longer for a worker. A null looper counts as held.
class InterfaceLock {
  public:
    explicit InterfaceLock(BLooper* looper);
    ~InterfaceLock();
    InterfaceLock(const InterfaceLock&) = delete;
    InterfaceLock& operator=(const InterfaceLock&) = delete;
    [[nodiscard]] bool IsHeld() const { return held_; }

  private:
    BLooper* looper_;
    bool held_;
};

// Shows a toolkit dialog and waits for its end, with the other loopers served. Returns its result;
// QDialog::Rejected also when the application quits meanwhile, or when cancelled (may be null) tells so while
// waiting.
int RunDialog(QDialog& dialog, const std::function<bool()>& cancelled = nullptr);
