#pragma once

#include "platform/Application.h"

// The desktop's knowledge of which program opens what.
class BRoster {
  public:
    // Asks the desktop to open the file in the person's preferred program. B_OK when the request was handed
    // over, B_NAME_NOT_FOUND when there is no such file, B_ERROR when the desktop took no request. It does
    // not wait for the program. Interface thread.
    status_t Launch(const entry_ref* ref) const;

    // Replaces the hand-over in tests, which must not start programs: called with the file's path, answering
    // whether it took it. Null restores the desktop.
    static void SetLauncher(bool (*launcher)(const char* path));
};

extern const BRoster* be_roster;
