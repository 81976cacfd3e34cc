#pragma once

#include <memory>

#include "platform/View.h"

// The codes of a watcher's messages: no button is down any more, the pointer is away from where it was
// pressed, or other buttons are down than those pressed. Each carries "where" (a point of the view),
// "buttons" and "modifiers" (int32), and "press" (int32), the number given at the start.
constexpr uint32 MouseWatcherUp = 0x4D772D55;    // 'Mw-U'
constexpr uint32 MouseWatcherMoved = 0x4D772D4D; // 'Mw-M'
constexpr uint32 MouseWatcherDown = 0x4D772D44;  // 'Mw-D'

// Follows the pointer while a button is held on a view, and tells the view by messages: a thread of its own
// looks every 50 ms. It does nothing with what it sees and touches nothing of the view but GetMouse, with the
// window's lock held.
//
// The view owns it. Destroying it keeps the thread from touching the view from then on; the thread itself
// ends within one look, as it does when all buttons are up or the window is gone.
class MouseWatcher {
  public:
    // Starts to watch view, which is in a window, after these buttons were pressed at this place. Null when
    // no thread can be had.
    static std::unique_ptr<MouseWatcher> Start(const BView* view, BPoint pressedAt, uint32 buttons,
                                               int32 press);
    ~MouseWatcher();
    MouseWatcher(const MouseWatcher&) = delete;
    MouseWatcher& operator=(const MouseWatcher&) = delete;

  private:
    struct Watch;
    explicit MouseWatcher(std::shared_ptr<Watch> watch);
    static int32 Run(void* data);

    std::shared_ptr<Watch> watch_;
};
