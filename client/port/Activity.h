#pragma once

#include <span>

#include "client/terminal/Deadline.h"
#include "client/terminal/Signals.h"
#include "client/terminal/TerminalKeys.h"

namespace vexa::client {

enum class Activity { Ready, StopAsked, Timeout };

/// Waits for one of `events` on the descriptor, for a signal that asks for the end, or until the deadline.
Activity waitForActivity(int descriptor, short events, Signals& signals, Deadline deadline);

/// One of several things to wait for. A descriptor below 0 is left out.
struct Awaited {
    int descriptor;
    short events;
};

/// The same for several. `keys`, if not null, end it too: with `q`.
Activity waitForActivity(std::span<const Awaited> awaited, Signals& signals, TerminalKeys* keys,
                         Deadline deadline);

}  // namespace vexa::client
