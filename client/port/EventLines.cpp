#include "client/port/EventLines.h"

#include <json/value.h>

#include <iostream>

#include "client/port/JsonLine.h"

namespace vexa::client {

bool printEvents(WebSocketClient& client) {
    while (const auto text = client.take())
        std::cout << eventLine(*text) << '\n';
    return static_cast<bool>(std::cout << std::flush);
}

std::string eventLine(const std::string& text) {
    return jsonLine(parseJson(text).value_or(Json::Value(text)));
}

}  // namespace vexa::client
