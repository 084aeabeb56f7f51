#pragma once

#include <chrono>
#include <ctime>
#include <optional>

namespace vexa::platform {

/// All waits, deadlines and periods. Machine time: on a simulated machine it may run faster than the wall
/// clock.
using Duration = std::chrono::microseconds;

/// The time since the process (or the simulated machine) started. Never goes back.
Duration now();

/// The calendar: time since 1970-01-01 00:00 UTC. May jump when the clock is corrected.
Duration wallTime();

/// The calendar of this moment in local time, as a time stamp shows it.
std::tm localTime();

/// Suspends the calling thread. Holds no lock that another thread needs in order to go on.
void sleepFor(Duration duration);

/// A limit for a wait; no value means for ever.
using Timeout = std::optional<Duration>;
inline constexpr Timeout kForever = std::nullopt;

}  // namespace vexa::platform
