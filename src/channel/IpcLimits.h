#pragma once

#include <cstddef>

namespace vexa {

/// Bytes of the largest message that a client may send.
inline constexpr std::size_t kMaxIpcMessage = std::size_t{1} << 20;

/// Bytes of several messages that may wait for a client behind the one that is going out to him.
inline constexpr std::size_t kMaxIpcQueued = std::size_t{4} << 20;

}  // namespace vexa
