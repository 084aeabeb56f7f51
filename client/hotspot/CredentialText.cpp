#include "client/hotspot/CredentialText.h"

#include "client/terminal/LineFit.h"
#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

std::string accessName(int access) {
    if (access == kAllUsers) return "all users";
    if (access == kPerUser) return "per user";
    return std::to_string(access);
}

std::string identity(const Credential& credential) {
    if (credential.type != kTypeCertificate) return credential.username;
    return credential.clientCert + (credential.caCert.empty() ? "" : ", CA " + credential.caCert);
}

/// The ids of a list, without those that the other one has not.
std::vector<int> keptIds(const CredentialList& list, const CredentialList& other) {
    std::vector<int> ids;
    for (const Credential& credential : list) {
        if (findById(other, credential.id) != nullptr) ids.push_back(credential.id);
    }
    return ids;
}

}  // namespace

std::vector<std::string> credentialTable(const CredentialList& list, Passwords passwords,
                                         std::optional<int> columns) {
    const std::vector<std::size_t> cut{2, 3, 7, 8};  // name, realm, creator, identity
    std::vector<std::vector<std::string>> rows{
        {"Pos", "Id", "Name", "Realm", "Method", "Access", "Auto", "Creator", "Identity"}};
    if (passwords == Passwords::Shown) rows.front().emplace_back("Password");
    for (const auto& credential : list) {
        rows.push_back({std::to_string(rows.size()), std::to_string(credential.id), credential.name,
                        credential.realm, methodName(credential), accessName(credential.access),
                        credential.autoConnect ? "yes" : "no", credential.creator, identity(credential)});
        if (passwords == Passwords::Shown) rows.back().push_back(credential.password);
    }
    if (columns) fitToColumns(rows, cut, *columns, ellipsis());
    return alignedLines(rows);
}

Json::Value credentialJson(const Credential& credential, std::size_t position, Passwords passwords) {
    Json::Value object(Json::objectValue);
    object["position"] = static_cast<Json::UInt64>(position);
    object["id"] = credential.id;
    object["name"] = credential.name;
    object["realm"] = credential.realm;
    object["method"] = methodName(credential);
    object["access"] = accessName(credential.access);
    object["autoConnect"] = credential.autoConnect;
    object["creator"] = credential.creator;
    if (credential.type == kTypeCertificate) {
        object["clientCert"] = credential.clientCert;
        object["caCert"] = credential.caCert;
    } else {
        object["username"] = credential.username;
        if (passwords == Passwords::Shown) object["password"] = credential.password;
    }
    return object;
}

Json::Value credentialsJson(const CredentialList& list, Passwords passwords) {
    Json::Value array(Json::arrayValue);
    for (const auto& credential : list)
        array.append(credentialJson(credential, array.size() + std::size_t{1}, passwords));
    return array;
}

std::string nameOf(const Credential& credential) {
    return "credential " + std::to_string(credential.id) + " " + inQuotes(credential.name);
}

std::vector<std::string> credentialChanges(const CredentialList& before, const CredentialList& now) {
    std::vector<std::string> told;
    for (const Credential& credential : before) {
        if (findById(now, credential.id) == nullptr) told.push_back(nameOf(credential) + " was deleted");
    }
    for (const Credential& credential : now) {
        const Credential* const known = findById(before, credential.id);
        if (known == nullptr)
            told.push_back(nameOf(credential) + " was added");
        else if (*known != credential)
            told.push_back(nameOf(credential) + " was changed");
    }
    if (keptIds(before, now) != keptIds(now, before))
        told.emplace_back("the credentials have another order of priority");
    return told;
}

}  // namespace vexa::client
