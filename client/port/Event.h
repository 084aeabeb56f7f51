#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>

namespace vexa::client {

/// What the service tells, taken out of its envelope. Without a payload `data` is empty.
struct Event {
    std::string id;
    std::string data;
    std::string source = {};
};

/// Nothing if the text, or the value, is no event.
std::optional<Event> parseEvent(std::string_view text);
std::optional<Event> eventOf(const Json::Value& envelope);

/// Its data as JSON; null if it is none.
Json::Value payloadOf(const Event& event);

/// The text of a command; `data` goes along as it is given.
std::string commandText(const std::string& id, const std::optional<std::string>& data = std::nullopt);

}  // namespace vexa::client
