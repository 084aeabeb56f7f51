#pragma once

namespace vexa {

// What the operations of the store and the engine give.

inline constexpr int kSuccess = 0;
inline constexpr int kFailure = 1;
inline constexpr int kNotFound = 2;  // also: a file that can't be opened
inline constexpr int kOutOfMemory = 3;
inline constexpr int kInvalidArgument = 4;
inline constexpr int kNoOwner = 5;
inline constexpr int kNoDocument = 7;
inline constexpr int kNetworkGone = 9;

// Outcomes of an attempt to connect that are no failures.

inline constexpr int kConnectStarted = 1;
inline constexpr int kConnectNothingLeft = 2;

}  // namespace vexa
