#pragma once

#include <string>

#include "client/port/Passwords.h"
#include "client/port/WebSocketClient.h"

namespace vexa::client {

/// Prints the messages that the client has taken in, JSON on one line each. False once nobody reads them.
bool printEvents(WebSocketClient& client, Passwords passwords = Passwords::Hidden);

/// One message likewise. What is not JSON is shown all the same, as a JSON string.
std::string eventLine(const std::string& text, Passwords passwords = Passwords::Hidden);

}  // namespace vexa::client
