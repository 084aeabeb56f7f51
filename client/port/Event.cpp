#include "client/port/Event.h"

#include "client/port/JsonLine.h"

namespace vexa::client {

std::optional<Event> parseEvent(std::string_view text) {
    const auto envelope = parseJsonObject(text);
    return envelope ? eventOf(*envelope) : std::nullopt;
}

std::optional<Event> eventOf(const Json::Value& envelope) {
    if (!envelope.isObject()) return std::nullopt;
    const Json::Value& id = envelope["EventId"];
    const Json::Value& data = envelope["Data"];
    if (!id.isString() || !(data.isString() || data.isNull())) return std::nullopt;
    const Json::Value& source = envelope["Source"];
    return Event{id.asString(), data.asString(), source.isString() ? source.asString() : ""};
}

Json::Value payloadOf(const Event& event) {
    return parseJson(event.data).value_or(Json::Value());
}

std::string commandText(const std::string& id, const std::optional<std::string>& data) {
    Json::Value command(Json::objectValue);
    command["CommandId"] = id;
    if (data) command["Data"] = *data;
    return jsonLine(command);
}

}  // namespace vexa::client
