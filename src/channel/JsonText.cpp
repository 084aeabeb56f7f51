#include "channel/JsonText.h"

// The styled writer's text is what clients know; the library's newer one indents otherwise.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/reader.h>
#include <json/writer.h>

#include <algorithm>
#include <array>
#include <new>

#include "text/Utf8.h"

namespace vexa {

namespace {

// What stands behind the backslash in place of a byte; 0: it stands for itself.
constexpr std::array<char, 256> kEscapes = [] {
    std::array<char, 256> escapes{};
    for (std::size_t byte = 0; byte < escapes.size(); ++byte)
        if (byte < ' ' || byte >= 0x80) escapes[byte] = 'u';
    constexpr std::string_view kShort = "\"\"\\\\\bb\ff\nn\rr\tt";
    for (std::size_t i = 0; i < kShort.size(); i += 2)
        escapes[static_cast<unsigned char>(kShort[i])] = kShort[i + 1];
    return escapes;
}();

char escapeOf(char c) {
    return kEscapes[static_cast<unsigned char>(c)];
}

void appendUnit(std::string& json, char32_t unit) {
    const auto digit = [unit](int shift) { return "0123456789abcdef"[unit >> shift & 15]; };
    const char escape[] = {'\\', 'u', digit(12), digit(8), digit(4), digit(0)};
    json.append(escape, sizeof escape);
}

}  // namespace

std::string toStyledText(const Json::Value& value) {
    Json::StyledWriter writer;
    return writer.write(value);
}

void appendQuoted(std::string& json, std::string_view text) {
    json += '"';
    for (;;) {
        const auto special = std::find_if(text.begin(), text.end(), [](char c) { return escapeOf(c) != 0; });
        json.append(text.begin(), special);
        text.remove_prefix(static_cast<std::size_t>(special - text.begin()));
        if (text.empty()) break;
        if (const char escape = escapeOf(text[0]); escape != 'u') {
            json.append({'\\', escape});
            text.remove_prefix(1);
            continue;
        }
        const Utf8Character character = firstUtf8Character(text);
        if (character.codePoint < 0x10000) {
            appendUnit(json, character.codePoint);
        } else {
            std::u16string units;
            appendUtf16(units, character.codePoint);
            for (const char16_t unit : units)
                appendUnit(json, unit);
        }
        text.remove_prefix(std::max<std::size_t>(character.length, 1));
    }
    json += '"';
}

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
