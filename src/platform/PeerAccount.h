#pragma once

#include <cstdint>

namespace vexa::platform {

/// Whether the process at the other end of a local TCP connection runs under the account of this one. The
/// connection is named as the peer sees it: its own port and the port it is connected to, both on 127.0.0.1,
/// in host byte order. False also where it can't be told.
bool isPeerOfSameAccount(std::uint16_t peerPort, std::uint16_t serverPort);

}  // namespace vexa::platform
