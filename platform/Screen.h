#pragma once

#include "platform/Rect.h"

// The main screen, as of the moment of the call. Interface thread.
class BScreen {
  public:
    // In logical pixels; the left top is (0, 0) on a single screen.
    [[nodiscard]] BRect Frame() const;
};
