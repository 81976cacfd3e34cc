#pragma once

#include "platform/Application.h"

// An application for commands that draw and show nothing: it needs no display and does not even look for one.
// Made on the main thread, in place of a BApplication.
class OffscreenApplication : public BApplication {
  public:
    OffscreenApplication();
};
