#pragma once

#include <chrono>

#include "client/hotspot/ConnectionJudge.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

/// Waits until the judge has an outcome of the request that was sent last; Open if there is none within the
/// limit. Throws NoAnswer.
Outcome awaitOutcome(HotspotPort& port, ConnectionJudge& judge, std::chrono::milliseconds limit);

/// Why there was no other outcome, about a network in quotes: "the radio was turned off".
std::string reasonOf(Outcome outcome, const std::string& network);

}  // namespace vexa::client
