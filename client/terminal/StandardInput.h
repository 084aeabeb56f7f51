#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string>

#include "client/terminal/Signals.h"

namespace vexa::client {

/// A person types what comes on standard input.
bool isInputTerminal();

/// What has come on standard input, after waitForInput() or waitFor() has told of it; 0 bytes at its end.
std::size_t readStandardInput(std::span<char> buffer);

/// The next line of standard input; nothing if the input ends before anything was read. A terminal does not
/// show what is typed, and is as before when this returns or throws, and while the process is suspended.
/// Throws StoppedByUser if the user ends the wait.
std::optional<std::string> readHiddenLine(Signals& signals, const std::string& prompt);

}  // namespace vexa::client
