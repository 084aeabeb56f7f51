#include "channel/JsonText.h"

// The old reader takes what clients send; the library's newer one is stricter.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/reader.h>

#include <new>

namespace vexa {

std::optional<Json::Value> parseReceived(std::string_view bytes) {
    try {
        return parseJsonText(bytes.substr(0, bytes.find('\0')));
    } catch (const std::bad_alloc&) {
        return std::nullopt;
    }
}

Json::Value parseJsonText(std::string_view text) {
    Json::Value root;
    Json::Reader reader;
    try {
        return reader.parse(text.data(), text.data() + text.size(), root) ? root : Json::Value();
    } catch (const Json::Exception&) {
        return {};
    }
}

std::optional<std::string> readText(const Json::Value& object, const char* member) {
    if (object.isNull()) return std::string();
    if (!object.isObject()) return std::nullopt;
    const Json::Value& value = object[member];
    if (value.isNull()) return std::string();
    if (value.isBool()) return value.asBool() ? "true" : "false";
    if (value.isString()) return value.asString();
    return std::nullopt;
}

}  // namespace vexa
