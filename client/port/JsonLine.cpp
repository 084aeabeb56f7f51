#include "client/port/JsonLine.h"

#include <json/reader.h>
#include <json/writer.h>

#include <memory>

#include "client/terminal/Text.h"

namespace vexa::client {

std::string jsonLine(const Json::Value& value) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    builder["emitUTF8"] = true;
    builder["precision"] = 15;  // what a double keeps of a decimal: 0.1 is no 0.10000000000000001
    return withoutHidden(Json::writeString(builder, value));
}

std::optional<Json::Value> parseJson(std::string_view text) {
    const std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
    Json::Value value;
    try {
        if (reader->parse(text.data(), text.data() + text.size(), &value, nullptr)) return value;
    } catch (const Json::Exception&) {  // nested too deep
    }
    return std::nullopt;
}

std::optional<Json::Value> parseJsonObject(std::string_view text) {
    auto value = parseJson(text);
    if (!value || !value->isObject()) return std::nullopt;
    return value;
}

}  // namespace vexa::client
