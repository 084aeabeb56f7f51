#pragma once

#include <chrono>
#include <cstdint>

#include "client/machine/KernelName.h"
#include "client/terminal/Signals.h"

namespace vexa::client {

/// The right to change the credentials of the service on a port. Of all `vexa` processes one has it at a
/// time, so that none works from a list that another is changing, and none takes another's answer for its
/// own.
class ChangeTurn {
public:
    /// Waits until it is our turn. Throws ClientError if that takes longer than `limit`, StoppedByUser if the
    /// user ends the wait.
    ChangeTurn(std::uint16_t port, Signals& signals, std::chrono::milliseconds limit);

private:
    NameHolder m_holder;
};

}  // namespace vexa::client
