#pragma once

namespace vexa::contract {

// The named mutexes by which the service and its parent know of each other.

/// Held by the parent; when he lets go or dies, the service ends.
inline constexpr const char* kStopMutex = "{39EAA3ED-1A26-46B7-90A7-AAFFECE80392}";

/// Open in the one service of a machine.
inline constexpr const char* kInstanceMutex = "{EB028547-0B5C-4BFF-A23E-78656D726C04}";

}  // namespace vexa::contract
