#include "protocol/JsonText.h"

// The styled writer's text is what clients know; the library's newer one indents otherwise.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/reader.h>
#include <json/writer.h>

namespace vexa {

std::string toStyledText(const Json::Value& value) {
    Json::StyledWriter writer;
    return writer.write(value);
}

Json::Value parseJsonText(std::string_view text) {
    text = text.substr(0, text.find('\0'));
    Json::Value root;
    Json::Reader reader;
    try {
        reader.parse(text.data(), text.data() + text.size(), root);
    } catch (const Json::Exception&) {
        return {};
    }
    return root;
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
