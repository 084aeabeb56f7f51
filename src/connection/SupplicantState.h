#pragma once

#include <cstdint>

namespace vexa {

/// How an adapter stands to the networks around it.
enum class SupplicantState : std::int32_t {
    InvalidState,
    Initialized,
    Connecting,
    Connected,
    Disconnecting,
    Disconnected,
    InterfaceDisabled,
    Scanning,
    Authenticating,
    Associating,
    Associated,
    Disassociating,
    Auth4WayHandshake,
    GroupHandshake,
};

/// Its name in the log.
const char* nameOf(SupplicantState state);

}  // namespace vexa
