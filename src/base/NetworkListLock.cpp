#include "base/NetworkListLock.h"

#include "text/NeverDestroyed.h"

namespace vexa {

namespace {

NeverDestroyed<platform::RecursiveMutex> g_lock("the network list lock");

}  // namespace

platform::RecursiveMutex& g_hs20Lock = g_lock.get();

}  // namespace vexa
