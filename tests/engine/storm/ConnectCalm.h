#pragma once

#include <cstdint>
#include <string>

#include "engine/world/World.h"

namespace vexa::test {

/// A storm of this many steps in which credentials may connect by themselves. Behind each part of it all that
/// stands in the way of a connection is undone, a network that lets in a credential of its own is shown, and
/// the engine is left alone: it has to be connected within a minute. Gives what is wrong.
std::string stormOfConnections(World& world, std::uint64_t seed, int steps);

}  // namespace vexa::test
