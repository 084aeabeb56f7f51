#pragma once

#include <cstdint>

namespace vexa::platform {

/// Takes the operating system's socket library, major version in the low byte. False: it refused. Every
/// success wants one stopSocketLibrary().
bool startSocketLibrary(std::uint16_t version);
void stopSocketLibrary();

}  // namespace vexa::platform
