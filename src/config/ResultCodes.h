#pragma once

namespace vexa {

// What the operations of the store and the engine give.

inline constexpr int kSuccess = 0;
inline constexpr int kFailure = 1;
inline constexpr int kNotFound = 2;  // also: a file that can't be opened
inline constexpr int kOutOfMemory = 3;
inline constexpr int kInvalidArgument = 4;
inline constexpr int kNoDocument = 7;

}  // namespace vexa
