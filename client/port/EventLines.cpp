#include "client/port/EventLines.h"

#include <json/value.h>

#include <iostream>

#include "client/port/JsonLine.h"

namespace vexa::client {

bool printEvents(WebSocketClient& client) {
    while (const auto text = client.take())
        printEvent(*text);
    return static_cast<bool>(std::cout << std::flush);
}

// What is not JSON is shown all the same, as a JSON string.
void printEvent(const std::string& text) {
    std::cout << jsonLine(parseJson(text).value_or(Json::Value(text))) << '\n';
}

}  // namespace vexa::client
