#include "hotspotport/CredentialInputReader.h"

#include <array>

#include "text/TextConversion.h"
#include "text/XmlWellFormed.h"

namespace vexa {

namespace {

constexpr std::size_t kMaxName = 127;
constexpr std::size_t kMaxAccount = 63;
constexpr std::int32_t kAnyMethod = 0;

struct NumberMember {
    const char* name;
    std::int32_t CredentialInput::*field;
};

struct FlagMember {
    const char* name;
    bool CredentialInput::*field;
};

struct TextMember {
    const char* name;
    std::wstring CredentialInput::*field;
    std::size_t limit;       // in UTF-16 units
    std::int32_t eapMethod;  // read only with this method
    bool emptyContainerIsText;
};

constexpr std::array<NumberMember, 3> kNumbers = {{
    {"CredentialEapMethod", &CredentialInput::eapMethod},
    {"Type", &CredentialInput::type},
    {"AccessType", &CredentialInput::accessType},
}};

constexpr std::array<FlagMember, 2> kFlags = {{
    {"IsPrefered", &CredentialInput::isPrefered},
    {"AutoConnect", &CredentialInput::autoConnect},
}};

constexpr std::array<TextMember, 7> kTexts = {{
    {"CredentialName", &CredentialInput::credName, kMaxName, kAnyMethod, false},
    {"RealName", &CredentialInput::realm, kMaxName, kAnyMethod, false},
    {"Creator", &CredentialInput::creator, kMaxAccount, kAnyMethod, false},
    {"Username", &CredentialInput::username, kMaxAccount, kEapMethodTtls, false},
    {"Password", &CredentialInput::password, kMaxAccount, kEapMethodTtls, false},
    {"ClientCert", &CredentialInput::clientCert, kMaxName, kEapMethodTls, false},
    {"CaCert", &CredentialInput::caCert, kMaxName, kEapMethodTls, true},
}};

const Json::Value& memberOf(const Json::Value& data, const char* name) {
    return data.isObject() ? data[name] : Json::Value::nullSingleton();
}

bool readFlag(const Json::Value& value, bool& flag) {
    if (!value.isNull() && !value.isBool()) return false;
    flag = value.isBool() && value.asBool();
    return true;
}

bool readLimitedText(const Json::Value& value, const TextMember& member, std::wstring& text) {
    const bool isEmptyContainer = (value.isArray() || value.isObject()) && value.empty();
    if (value.isNull() || (member.emptyContainerIsText && isEmptyContainer)) return true;
    if (!value.isString()) return false;
    const std::wstring whole = wideFromUtf8(value.asString());
    text = cutToUtf16Units(whole.substr(0, whole.find(L'\0')), member.limit);
    return canStandInXml(text);
}

}  // namespace

std::optional<std::int32_t> readInteger(const Json::Value& data, const char* member) {
    if (!data.isNull() && !data.isObject()) return std::nullopt;
    const Json::Value& value = memberOf(data, member);
    if (value.isNull()) return 0;
    const bool isInteger = value.type() == Json::intValue || value.type() == Json::uintValue;
    return isInteger && value.isInt() ? std::optional(value.asInt()) : std::nullopt;
}

std::optional<CredentialInput> readCredentialInput(const Json::Value& data) {
    CredentialInput input;
    for (const NumberMember& member : kNumbers) {
        const auto number = readInteger(data, member.name);
        if (!number) return std::nullopt;
        input.*member.field = *number;
    }
    for (const FlagMember& member : kFlags)
        if (!readFlag(memberOf(data, member.name), input.*member.field)) return std::nullopt;
    for (const TextMember& member : kTexts) {
        if (member.eapMethod != kAnyMethod && member.eapMethod != input.eapMethod) continue;
        if (!readLimitedText(memberOf(data, member.name), member, input.*member.field)) return std::nullopt;
    }
    return input;
}

}  // namespace vexa
