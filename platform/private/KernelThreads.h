// The application object's way to end what still runs when it goes. Only for the layer's own sources.
#pragma once

#include "platform/Types.h"

// Asks every thread that spawn_thread made to stop and waits for their ends, at most patience microseconds in
// all.
void StopAllThreads(bigtime_t patience);
