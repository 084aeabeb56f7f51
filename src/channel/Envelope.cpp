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

std::string buildEnvelope(const std::string& eventId, const char* source,
                          const std::optional<std::string>& data) {
    Json::Value event;
    event["Source"] = source;
    event["EventId"] = eventId;
    if (data) event["Data"] = *data;
    event["Timestamp"] = timestamp();
    return toStyledText(event);
}

}  // namespace vexa
