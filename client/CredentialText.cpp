#include "client/CredentialText.h"

#include "client/Text.h"

namespace vexa::client {

namespace {

std::string accessName(int access) {
    if (access == kAllUsers) return "all users";
    if (access == kPerUser) return "per user";
    return std::to_string(access);
}

std::string identity(const Credential& credential) {
    if (credential.type != kTypeCertificate) return "user " + credential.username;
    std::string text = "certificate " + credential.clientCert;
    if (!credential.caCert.empty()) text += ", CA " + credential.caCert;
    return text;
}

}  // namespace

std::vector<std::string> credentialTable(const CredentialList& list, Passwords passwords) {
    std::vector<std::vector<std::string>> rows{
        {"Position", "Id", "Name", "Realm", "Method", "Access", "Auto-connect", "Creator", "Identity"}};
    if (passwords == Passwords::Shown) rows.front().emplace_back("Password");
    for (const auto& credential : list) {
        rows.push_back({std::to_string(rows.size()), std::to_string(credential.id), credential.name,
                        credential.realm, methodName(credential), accessName(credential.access),
                        credential.autoConnect ? "yes" : "no", credential.creator, identity(credential)});
        if (passwords == Passwords::Shown) rows.back().push_back(credential.password);
    }
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

}  // namespace vexa::client
