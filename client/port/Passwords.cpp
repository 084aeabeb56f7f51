#include "client/port/Passwords.h"

#include "client/port/JsonLine.h"

namespace vexa::client {

namespace {

constexpr const char* kPassword = "Password";

void hideWithin(Json::Value& value) {
    if (!value.isArray() && !value.isObject()) return;
    for (Json::Value& member : value)
        hideWithin(member);
    if (!value.isObject() || !value.isMember(kPassword)) return;
    Json::Value& password = value[kPassword];
    if (!password.isString() || !password.asString().empty()) password = kHiddenPassword;
}

}  // namespace

// The data is JSON in a text.
void hidePasswords(Json::Value& envelope) {
    if (!envelope.isObject() || !envelope.get("Data", Json::Value()).isString()) return;
    const std::string data = envelope["Data"].asString();
    if (data.find(kPassword) == std::string::npos) return;
    if (auto payload = parseJson(data)) {
        hideWithin(*payload);
        envelope["Data"] = jsonLine(*payload);
    } else {
        envelope.removeMember("Data");
    }
}

}  // namespace vexa::client
