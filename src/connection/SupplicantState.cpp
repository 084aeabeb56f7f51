#include "connection/SupplicantState.h"

#include <array>
#include <cstddef>

namespace vexa {

namespace {

constexpr std::array<const char*, 14> kStateNames = {
    "InvalidState", "Initialized",       "Connecting",        "Connected",      "Disconnecting",
    "Disconnected", "InterfaceDisabled", "Scanning",          "Authenticating", "Associating",
    "Associated",   "Disassociating",    "Auth4WayHandshake", "GroupHandshake"};

}  // namespace

const char* nameOf(SupplicantState state) {
    return kStateNames[static_cast<std::size_t>(state)];
}

}  // namespace vexa
