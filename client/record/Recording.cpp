#include "client/record/Recording.h"

#include <json/value.h>

#include "client/port/JsonLine.h"
#include "client/port/Passwords.h"

namespace vexa::client {

namespace {

constexpr const char* kSpectralName = "sa";
constexpr const char* kHotspotName = "hs20";

std::optional<RecordedTime> timeOf(const Json::Value& object) {
    const Json::Value& value = object["ms"];
    if (!value.isInt64() || value.asInt64() < 0) return std::nullopt;
    return RecordedTime(value.asInt64());
}

std::string textOf(const Json::Value& value) {
    return value.isString() ? value.asString() : "";
}

Json::Value timed(RecordedTime at) {
    Json::Value object(Json::objectValue);
    object["ms"] = static_cast<Json::Int64>(at.count());
    return object;
}

}  // namespace

std::string headerLine(const RecordingHeader& header) {
    Json::Value object(Json::objectValue);
    object["recording"] = "vexa";
    object["format"] = header.format;
    object["version"] = header.version;
    object["started"] = header.started;
    object["passwords"] = header.showsPasswords;
    return jsonLine(object);
}

std::optional<std::string> recordedLine(RecordedTime at, RecordedPort port, const std::string& text,
                                        bool showPasswords) {
    auto envelope = parseJsonObject(text);
    if (!envelope || !eventOf(*envelope)) return std::nullopt;
    if (!showPasswords) hidePasswords(*envelope);
    Json::Value object = timed(at);
    object["port"] = port == RecordedPort::Spectral ? kSpectralName : kHotspotName;
    object["event"] = *envelope;
    return jsonLine(object);
}

std::string endLine(RecordedTime at) {
    Json::Value object = timed(at);
    object["end"] = true;
    return jsonLine(object);
}

std::optional<RecordingHeader> parseHeader(std::string_view line) {
    const auto object = parseJsonObject(line);
    if (!object || (*object)["recording"] != "vexa" || !(*object)["format"].isInt()) return std::nullopt;
    return RecordingHeader{(*object)["format"].asInt(), textOf((*object)["version"]),
                           textOf((*object)["started"]), (*object)["passwords"] == true};
}

std::optional<RecordedLine> parseRecordedLine(std::string_view line) {
    const auto object = parseJsonObject(line);
    const auto at = object ? timeOf(*object) : std::nullopt;
    if (!at) return std::nullopt;
    if ((*object)["end"] == true) return RecordedLine{*at, std::nullopt};
    const std::string port = textOf((*object)["port"]);
    if (port != kSpectralName && port != kHotspotName) return std::nullopt;
    const auto event = eventOf((*object)["event"]);
    if (!event) return std::nullopt;
    return RecordedLine{
        *at,
        RecordedEvent{*at, port == kSpectralName ? RecordedPort::Spectral : RecordedPort::Hotspot, *event}};
}

}  // namespace vexa::client
