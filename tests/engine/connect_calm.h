#pragma once

#include <cstdint>
#include <string>

#include "engine/World.h"

namespace vexa::test {

/// REQUIRES: the network that stormOfConnections() has added. Undoes what stands in the way of any
/// connection, shows a network that lets in a credential of its own, and leaves the engine alone. Gives the
/// log if nothing is connected after `patience`, empty otherwise.
std::string joinsWhenLeftAlone(World& world, platform::Duration patience);

/// A storm of this many steps in which credentials may connect by themselves, and such an ending behind each
/// part of it. Gives what is wrong.
std::string stormOfConnections(World& world, std::uint64_t seed, int steps, platform::Duration patience);

}  // namespace vexa::test
