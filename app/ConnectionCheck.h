#pragma once

#include "platform/Rect.h"
#include "quotes/run/PriceRun.h"

// Finds out whether the host's name resolves. The look-up has a thread of its own, since it can take long:
// the windows stay painted meanwhile. Unless the answer is there in an instant, a dialog with its left top
// corner at the given place says what is waited for and offers to cancel it; Cancelled is also the answer
// when the application quits. It waits for the answer, and messages of the calling window wait with it.
// Interface thread.
[[nodiscard]] Connection CheckConnection(const char* host, BPoint leftTop);
