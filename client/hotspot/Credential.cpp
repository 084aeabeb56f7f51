#include "client/hotspot/Credential.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <utility>

#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Nearest.h"
#include "client/terminal/Text.h"
#include "text/Utf8.h"

namespace vexa::client {

namespace {

constexpr std::size_t kNameLimit = 127;
constexpr std::size_t kAccountLimit = 63;

struct NumberMember {
    const char* name;
    int Credential::*field;
};
constexpr std::array kNumbers{NumberMember{"Id", &Credential::id}, NumberMember{"Type", &Credential::type},
                              NumberMember{"AccessType", &Credential::access},
                              NumberMember{"CredentialEapMethod", &Credential::method}};

struct TextMember {
    const char* name;
    std::string Credential::*field;
    const char* noun;
    std::size_t limit;
};
constexpr std::array kTexts{
    TextMember{"CredentialName", &Credential::name, "name", kNameLimit},
    TextMember{"RealName", &Credential::realm, "realm", kNameLimit},
    TextMember{"Creator", &Credential::creator, "creator", kAccountLimit},
    TextMember{"CaCert", &Credential::caCert, "CA certificate", kNameLimit},
    TextMember{"ClientCert", &Credential::clientCert, "client certificate", kNameLimit},
    TextMember{"Username", &Credential::username, "user name", kAccountLimit},
    TextMember{"Password", &Credential::password, "password", kAccountLimit},
};

std::optional<Credential> parseCredential(const Json::Value& value) {
    if (!value.isObject()) return std::nullopt;
    Credential credential;
    for (const auto& member : kNumbers) {
        if (!value[member.name].isInt()) return std::nullopt;
        credential.*member.field = value[member.name].asInt();
    }
    for (const auto& member : kTexts) {
        if (!value[member.name].isString()) return std::nullopt;
        credential.*member.field = value[member.name].asString();
    }
    const Json::Value& autoConnect = value["AutoConnect"];
    credential.autoConnect = autoConnect.isBool() && autoConnect.asBool();
    return credential;
}

std::optional<int> asId(const std::string& text) {
    int id = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), id);
    if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
    return id;
}

std::string whyNotFound(const CredentialList& list, const std::string& given) {
    std::vector<std::string> names;
    for (const Credential& credential : list)
        names.push_back(credential.name);
    return "there is no credential " + inQuotes(given) +
           (names.empty() ? "" : "; there is " + namesLike(std::move(names), given));
}

bool isControl(char character) {
    const auto byte = static_cast<unsigned char>(character);
    return byte < 0x20 || byte == 0x7F;
}

}  // namespace

CredentialList credentialList(const Json::Value& payload) {
    CredentialList list;
    if (!payload.isArray()) return list;
    for (const Json::Value& entry : payload) {
        if (auto credential = parseCredential(entry)) list.push_back(std::move(*credential));
    }
    return list;
}

std::string credentialData(const Credential& credential) {
    Json::Value data(Json::objectValue);
    for (const auto& member : kNumbers)
        data[member.name] = credential.*member.field;
    for (const auto& member : kTexts)
        data[member.name] = credential.*member.field;
    data["AutoConnect"] = credential.autoConnect;
    return jsonLine(data);
}

std::string methodName(const Credential& credential) {
    if (credential.type == kTypeUser) return "TTLS";
    if (credential.type == kTypeCertificate) return "TLS";
    return "type " + std::to_string(credential.type);
}

const Credential& findCredential(const CredentialList& list, const std::string& idOrName) {
    const auto id = asId(idOrName);
    const Credential* const byId = id ? findById(list, *id) : nullptr;
    if (byId == nullptr) return findNamed(list, idOrName);
    for (const Credential& other : list) {
        if (other.name == idOrName && other.id != byId->id)
            throw ClientError(inQuotes(idOrName) + " is the id of credential " + inQuotes(byId->name) +
                              " and the name of credential " + std::to_string(other.id) + ": give --id " +
                              std::to_string(byId->id) + " or --id " + std::to_string(other.id));
    }
    return *byId;
}

const Credential& findNamed(const CredentialList& list, const std::string& name) {
    const auto hasName = [&](const Credential& credential) { return credential.name == name; };
    const auto first = std::find_if(list.begin(), list.end(), hasName);
    if (first == list.end()) throw ClientError(whyNotFound(list, name));
    if (std::find_if(first + 1, list.end(), hasName) != list.end())
        throw ClientError("several credentials are named " + inQuotes(name) + ": give an id");
    return *first;
}

const Credential* findById(const CredentialList& list, int id) {
    const auto found = std::find_if(list.begin(), list.end(),
                                    [id](const Credential& credential) { return credential.id == id; });
    return found == list.end() ? nullptr : &*found;
}

std::size_t positionOf(const CredentialList& list, int id) {
    return static_cast<std::size_t>(findById(list, id) - list.data()) + 1;
}

std::optional<std::string> objectionTo(const Credential& credential) {
    for (const auto& member : kTexts) {
        const std::string& text = credential.*member.field;
        const std::string subject = std::string("the ") + member.noun + " ";
        if (!isValidUtf8(text)) return subject + "is no UTF-8 text";
        if (std::any_of(text.begin(), text.end(), isControl)) return subject + "holds a control character";
        if (utf16Length(text) > member.limit)
            return subject + "is longer than " + std::to_string(member.limit) + " characters";
    }
    return std::nullopt;
}

}  // namespace vexa::client
