#pragma once

#include <cstdint>
#include <span>

namespace vexa::client {

/// Fills it with what nobody can guess, from the operating system's source for secrets. Throws ClientError if
/// there is none.
void fillWithRandom(std::span<std::uint8_t> bytes);

}  // namespace vexa::client
