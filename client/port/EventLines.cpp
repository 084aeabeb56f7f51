#include "client/port/EventLines.h"

#include <json/value.h>

#include <iostream>

#include "client/port/JsonLine.h"

namespace vexa::client {

namespace {

constexpr const char* kPassword = "Password";

/// True if there is any.
bool hidePasswords(Json::Value& value) {
    if (!value.isObject() && !value.isArray()) return false;
    bool isAny = false;
    for (Json::Value& element : value)
        isAny = hidePasswords(element) || isAny;
    if (!value.isObject() || value.get(kPassword, "") == Json::Value("")) return isAny;
    value[kPassword] = kHiddenPassword;
    return true;
}

// The data is JSON in a text.
void hidePasswordsOfData(Json::Value& event) {
    if (!event.isObject() || !event["Data"].isString()) return;
    auto data = parseJson(event["Data"].asString());
    if (data && hidePasswords(*data)) event["Data"] = jsonLine(*data);
}

}  // namespace

bool printEvents(WebSocketClient& client, Passwords passwords) {
    while (const auto text = client.take())
        std::cout << eventLine(*text, passwords) << '\n';
    return static_cast<bool>(std::cout << std::flush);
}

std::string eventLine(const std::string& text, Passwords passwords) {
    Json::Value event = parseJson(text).value_or(Json::Value(text));
    if (passwords == Passwords::Hidden && text.find(kPassword) != std::string::npos)
        hidePasswordsOfData(event);
    return jsonLine(event);
}

}  // namespace vexa::client
