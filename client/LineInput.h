#pragma once

#include <optional>
#include <string>

#include "client/Signals.h"

namespace vexa::client {

/// The next line of standard input; nothing if the input ends before anything was read. A terminal does not
/// show what is typed, and is as before when this returns or throws, and while the process is suspended.
/// Throws StoppedByUser if the user ends the wait.
std::optional<std::string> readHiddenLine(Signals& signals, const std::string& prompt);

}  // namespace vexa::client
