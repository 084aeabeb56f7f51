#pragma once

#include "client/WebSocketClient.h"

namespace vexa::client {

/// Prints the messages that the client has taken in, JSON on one line each. False once nobody reads them.
bool printEvents(WebSocketClient& client);

}  // namespace vexa::client
