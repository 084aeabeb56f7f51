#include "channel/Envelope.h"

#include <json/value.h>

#include <ctime>

#include "channel/JsonText.h"
#include "platform/Clock.h"

namespace vexa {

namespace {

std::string timestamp() {
    const std::tm time = platform::localTime();
    char text[30];
    std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%S ", &time);
    return text;
}

}  // namespace

// `Data` stands first, and may be long: it is never held more than twice.
std::string buildEnvelope(const std::string& eventId, const char* source, std::optional<std::string> data) {
    Json::Value event;
    event["Source"] = source;
    event["EventId"] = eventId;
    event["Timestamp"] = timestamp();
    const std::string withoutData = toStyledText(event);
    if (!data) return withoutData;
    std::string text = "{\n   \"Data\" : ";
    text.reserve(text.size() + data->size() + data->size() / 4 + withoutData.size());
    appendQuoted(text, *data);
    return text.append(",").append(withoutData, 1);
}

}  // namespace vexa
