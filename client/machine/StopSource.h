#pragma once

#include "client/terminal/EventLoop.h"

namespace vexa::client {

/// Where a parent waits: for a request to stop, for something to have happened to a child, or for a while.
class StopSource {
public:
    /// `stopOnEndOfInput`: the end of standard input is a request to stop as well.
    StopSource(Signals& signals, bool stopOnEndOfInput);

    /// May return early. False: it is to stop; every request is told once.
    bool wait(Deadline deadline);

private:
    EventLoop m_loop;
    bool m_watchInput;
};

}  // namespace vexa::client
