#pragma once

#include <string>

#include "client/terminal/Signals.h"

namespace vexa::client {

/// The first line of standard input. Throws ClientError if there is none.
std::string readPassword(Signals& signals);

/// Asks on the terminal, twice, without echo. The terminal is as before when it returns or throws, and while
/// the process is suspended. Throws ClientError if standard input is no terminal or the answers differ,
/// StoppedByUser on Ctrl-C.
std::string askPassword(Signals& signals);

}  // namespace vexa::client
