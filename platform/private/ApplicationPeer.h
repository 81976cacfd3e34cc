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

// The toolkit calls every widget that is no control of its own a mere filler, which screen readers pass over.
// From here on windows are windows or dialogs, a view with an accessible description is a picture, and the
// parts of a view are its children. To be called once the toolkit is there.
void NameAccessibleRoles();
