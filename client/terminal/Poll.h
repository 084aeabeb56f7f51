#pragma once

#include <span>

#include "client/terminal/Deadline.h"

namespace vexa::client {

inline constexpr short kReadable = 1;
inline constexpr short kWritable = 2;

/// Standard input as something to wait for.
inline constexpr int kStandardInput = 0;

/// One thing to wait for: a socket, the signals, the keys of the terminal or standard input. A descriptor
/// below 0 is left out. `happened`: what was found, also where it is the end or a failure.
struct Polled {
    int descriptor;
    short events;
    short happened = 0;
};

/// Waits until something has happened on one of them, or until the deadline. May return early with
/// nothing. Gives how many have something to tell.
int waitFor(std::span<Polled> polled, Deadline deadline);

}  // namespace vexa::client
