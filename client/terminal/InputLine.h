#pragma once

#include <optional>
#include <string>

#include "client/terminal/EventLoop.h"

namespace vexa::client {

// Each throws StoppedByUser if the user ends the wait.

/// Returns when standard input has something to read, or has ended.
void waitForInput(EventLoop& loop);

/// The next line of standard input, in bytes; nothing if the input ends before anything was read.
std::optional<std::string> readLine(EventLoop& loop);

/// All of standard input, in bytes.
std::string readToEnd(EventLoop& loop);

}  // namespace vexa::client
