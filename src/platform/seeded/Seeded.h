#pragma once

#include <cstdint>
#include <functional>

namespace vexa::platform {

/// Runs `story` and all threads that it starts, directly or not, in a world whose order and time belong to
/// the seed: one thread runs at a time and hands over only at operations of the platform, the seed decides
/// who is next, and when all wait, time jumps to the next deadline. The same seed gives the same run. The
/// calendar starts at 2026-01-05 08:00:00 UTC, which is also local time.
///
/// Returns when the story and all its threads have ended. If none can ever run again, the seed and what each
/// thread waits for go to standard error, and the process aborts.
void runSeeded(std::uint64_t seed, std::function<void()> story);

}  // namespace vexa::platform
