#pragma once

#include <array>
#include <cstdint>
#include <string_view>

namespace vexa::client {

/// The SHA-1 digest (RFC 3174), by which an operating system's store names its certificates. It proves
/// nothing any more.
std::array<std::uint8_t, 20> sha1(std::string_view bytes);

}  // namespace vexa::client
