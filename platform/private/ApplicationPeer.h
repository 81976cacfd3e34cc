#pragma once

#include <memory>
#include <mutex>
#include <vector>

#include <QApplication>

#include "platform/Application.h"

// What the application object has on the toolkit's side.
struct ApplicationPeer {
    std::mutex mutex; // guards the list of windows, which other threads look through
    std::vector<BWindow*> windows;
    std::unique_ptr<QApplication> toolkit;
    bool quitting = false; // interface thread
};

// The layer's own way into the application object.
struct ApplicationAccess {
    static void AddWindow(BWindow* window);
    static void RemoveWindow(BWindow* window);
    static void QuitWhenNothingWaits(BApplication& application);
    static void QuitModalWindows(BApplication& application);
    // Looks at every event: keeps modifiers() true, and the repeats of a held key from pressing buttons.
    static void WatchInput(QApplication& toolkit);
};

// Asks every thread that spawn_thread made to stop and waits for their ends, at most patience microseconds in
// all.
void StopAllThreads(bigtime_t patience);
