#pragma once

#include <chrono>
#include <optional>

#include "client/Signals.h"

namespace vexa::client {

enum class Activity { Ready, StopAsked, Timeout };

/// Waits for one of `events` on the descriptor, for a signal that asks for the end, or for the limit.
Activity waitForActivity(int descriptor, short events, Signals& signals,
                         std::optional<std::chrono::milliseconds> limit);

}  // namespace vexa::client
