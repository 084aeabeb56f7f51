#pragma once

namespace vexa {

/// What the operations of the store and the engine give.
enum class ResultCode {
    kSuccess = 0,
    kFailure = 1,
    kNotFound = 2,  // also: a file that can't be opened
    kOutOfMemory = 3,
    kInvalidArgument = 4,
    kNoDocument = 7,
};
using enum ResultCode;

/// How far an attempt to connect came.
enum class ConnectOutcome {
    kConnectFailed = 0,
    kConnectStarted = 1,
    kConnectNothingLeft = 2,  // no network to join, or no credential to join it with
    kNetworkGone = 9,
};
using enum ConnectOutcome;

}  // namespace vexa
