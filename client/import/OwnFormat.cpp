#include "client/import/OwnFormat.h"

#include <json/value.h>
#include <json/writer.h>

#include <algorithm>
#include <array>

#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"
#include "text/OneOf.h"

namespace vexa::client {

namespace {

constexpr const char* kFormat = "vexa-credentials";
constexpr int kFormatVersion = 1;

struct TextMember {
    const char* name;
    std::string Credential::*field;
    int type;  // of the credentials that have it; 0: all have
    bool isRequired;
};
constexpr std::array kTexts{TextMember{"name", &Credential::name, 0, false},
                            TextMember{"realm", &Credential::realm, 0, true},
                            TextMember{"username", &Credential::username, kTypeUser, false},
                            TextMember{"password", &Credential::password, kTypeUser, false},
                            TextMember{"clientCert", &Credential::clientCert, kTypeCertificate, false},
                            TextMember{"caCert", &Credential::caCert, kTypeCertificate, false}};
constexpr std::array kOtherMembers{"method", "access", "autoConnect"};

/// One of the words, as what it stands for.
struct Word {
    const char* text;
    int value;
};
constexpr std::array kMethods{Word{"TTLS", kTypeUser}, Word{"TLS", kTypeCertificate}};
constexpr std::array kAccess{Word{"all users", kAllUsers}, Word{"per user", kPerUser}};

/// One object of the list.
class EntryReader {
public:
    EntryReader(const Json::Value& entry, Json::ArrayIndex index)
        : m_entry(entry), m_place("credentials[" + std::to_string(index) + "]") {}

    Credential read() {
        if (!m_entry.isObject()) throw ClientError(m_place + " is no object");
        Credential credential;
        credential.type = wordOf("method", kMethods);
        credential.method = credential.type == kTypeUser ? kMethodTtls : kMethodTls;
        credential.access = m_entry.isMember("access") ? wordOf("access", kAccess) : kAllUsers;
        const Json::Value& autoConnect = m_entry["autoConnect"];
        if (!autoConnect.isNull() && !autoConnect.isBool()) fail("autoConnect", "is neither true nor false");
        credential.autoConnect = autoConnect.isNull() || autoConnect.asBool();
        for (const TextMember& member : kTexts) {
            if (member.type == 0 || member.type == credential.type) readText(member, credential);
        }
        if (credential.name.empty()) credential.name = credential.realm;
        if (const auto objection = objectionTo(credential)) throw ClientError(m_place + ": " + *objection);
        return credential;
    }

    /// Members that no credential of this type has.
    std::vector<std::string> strangers(const Credential& credential) const {
        std::vector<std::string> found;
        for (const std::string& name : m_entry.getMemberNames()) {
            const bool isText = std::any_of(kTexts.begin(), kTexts.end(), [&](const TextMember& member) {
                return name == member.name && (member.type == 0 || member.type == credential.type);
            });
            if (!isText && !isOneOf(kOtherMembers, name))
                found.push_back(m_place + "." + printable(name) + " is not kept");
        }
        return found;
    }

private:
    [[noreturn]] void fail(const char* member, const char* what) const {
        throw ClientError(m_place + "." + member + " " + what);
    }

    template <std::size_t N>
    int wordOf(const char* member, const std::array<Word, N>& words) const {
        for (const Word& word : words) {
            if (m_entry[member] == word.text) return word.value;
        }
        fail(member, "is none that is known");
    }

    void readText(const TextMember& member, Credential& credential) const {
        const Json::Value& value = m_entry[member.name];
        if (!value.isNull() && !value.isString()) fail(member.name, "is no text");
        if (value.isString()) credential.*member.field = value.asString();
        if (member.isRequired && (credential.*member.field).empty()) fail(member.name, "is missing");
    }

    const Json::Value& m_entry;
    std::string m_place;
};

}  // namespace

std::string ownFormat(const CredentialList& list, Passwords passwords) {
    Json::Value object(Json::objectValue);
    object["format"] = kFormat;
    object["version"] = kFormatVersion;
    object["credentials"] = credentialsJson(list, passwords);
    for (Json::Value& entry : object["credentials"]) {
        for (const char* member : {"position", "id", "creator"})
            entry.removeMember(member);
    }
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "  ";
    builder["emitUTF8"] = true;
    return Json::writeString(builder, object) + "\n";
}

CredentialFile readOwnFormat(const std::string& text) {
    const auto object = parseJsonObject(text);
    if (!object || (*object)["format"] != kFormat)
        throw ClientError("the file is no JSON that `vexa credential export` writes");
    if ((*object)["version"] != kFormatVersion)
        throw ClientError("the file is of a version that is not known: " + jsonLine((*object)["version"]));
    const Json::Value& entries = (*object)["credentials"];
    if (!entries.isArray()) throw ClientError("credentials is no array");
    CredentialFile file;
    for (Json::ArrayIndex i = 0; i < entries.size(); ++i) {
        EntryReader reader(entries[i], i);
        file.credentials.push_back({reader.read(), i, ""});
        const auto strangers = reader.strangers(file.credentials.back().credential);
        file.notes.insert(file.notes.end(), strangers.begin(), strangers.end());
    }
    return file;
}

}  // namespace vexa::client
