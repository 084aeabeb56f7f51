#include "client/EventLines.h"

#include <json/value.h>

#include <iostream>

#include "client/JsonLine.h"

namespace vexa::client {

bool printEvents(WebSocketClient& client) {
    while (const auto text = client.take()) {
        // What is not JSON is shown all the same, as a JSON string.
        std::cout << jsonLine(parseJson(*text).value_or(Json::Value(*text))) << '\n';
    }
    return static_cast<bool>(std::cout << std::flush);
}

}  // namespace vexa::client
