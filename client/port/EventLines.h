#pragma once

#include <string>

#include "client/port/WebSocketClient.h"

namespace vexa::client {

/// Prints the messages that the client has taken in, JSON on one line each. False once nobody reads them.
bool printEvents(WebSocketClient& client);

/// Prints one message likewise.
void printEvent(const std::string& text);

}  // namespace vexa::client
