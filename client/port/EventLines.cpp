#include "client/port/EventLines.h"

#include <json/value.h>

#include <iostream>

#include "client/port/JsonLine.h"

namespace vexa::client {

bool printEvents(WebSocketClient& client, Passwords passwords) {
    while (const auto text = client.take())
        std::cout << eventLine(*text, passwords) << '\n';
    return static_cast<bool>(std::cout << std::flush);
}

std::string eventLine(const std::string& text, Passwords passwords) {
    Json::Value event = parseJson(text).value_or(Json::Value(text));
    if (passwords == Passwords::Hidden) hidePasswords(event);
    return jsonLine(event);
}

}  // namespace vexa::client
