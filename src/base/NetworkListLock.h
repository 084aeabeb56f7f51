#pragma once

#include "platform/Mutex.h"

namespace vexa {

/// The one lock of the hotspot half: network list, credentials as the engine reads them, profiles, retries,
/// blocks, connection flags, and the queue of the log. Re-entrant, so that code under it can log. Never
/// destroyed.
extern platform::RecursiveMutex& g_hs20Lock;

}  // namespace vexa
