#pragma once

#include <windows.h>

#include <limits>

#include "client/terminal/Signals.h"

namespace vexa::client {

/// What Signals::descriptor() gives; no socket has this number.
inline constexpr int kSignalDescriptor = std::numeric_limits<int>::max();

/// Puts a signal where Signals finds it. Any thread.
void raiseSignal(Signal signal);

/// Set while a signal waits to be taken.
HANDLE signalEvent();
bool isSignalWaiting();

}  // namespace vexa::client
