#pragma once

#include <optional>

#include "client/terminal/Deadline.h"
#include "client/terminal/Signals.h"

namespace vexa::client {

/// Where a parent waits: for a request to stop, for something to have happened to a child, or for a while.
class StopSource {
public:
    enum class Wake { Stop, Child, Timeout };

    /// `stopOnEndOfInput`: the end of standard input is a request to stop as well.
    StopSource(Signals& signals, bool stopOnEndOfInput);

    /// Every request is told once.
    Wake wait(Deadline deadline);

private:
    std::optional<Wake> takeSignals();
    bool inputEnded();

    Signals& m_signals;
    bool m_watchInput;
};

}  // namespace vexa::client
