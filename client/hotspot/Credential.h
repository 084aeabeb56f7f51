#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace vexa::client {

inline constexpr int kMethodTls = 1;
inline constexpr int kMethodTtls = 2;
inline constexpr int kTypeUser = 1;
inline constexpr int kTypeCertificate = 3;
inline constexpr int kAllUsers = 1;
inline constexpr int kPerUser = 2;

/// A credential as the service tells of it, or as it is asked to store it. Text is UTF-8.
struct Credential {
    int id = 0;
    int type = 0;
    int access = 0;
    int method = 0;
    bool autoConnect = false;
    std::string name;
    std::string realm;
    std::string creator;
    std::string caCert;
    std::string clientCert;
    std::string username;
    std::string password;

    bool operator==(const Credential&) const = default;
};

using CredentialList = std::vector<Credential>;

/// The command that asks for the list, and the event that tells it.

/// The list out of the payload of its event, in the order of priority; entries that are none are left out.
CredentialList credentialList(const Json::Value& payload);

/// The data of a command that adds it, or with an id edits it.
std::string credentialData(const Credential& credential);

/// "TTLS", "TLS", or the type's number where it is neither.
std::string methodName(const Credential& credential);

/// The only credential that is meant by an id or a name. Throws ClientError if there is none, or if several
/// could be meant.
const Credential& findCredential(const CredentialList& list, const std::string& idOrName);

/// The only one of this name; throws likewise.
const Credential& findNamed(const CredentialList& list, const std::string& name);

/// Nothing if the list has no such id.
const Credential* findById(const CredentialList& list, int id);

/// From 1.
std::size_t positionOf(const CredentialList& list, int id);

/// What keeps the service from storing such text, as in "the realm is longer than 127 characters"; nothing if
/// it can.
std::optional<std::string> objectionTo(const Credential& credential);

}  // namespace vexa::client
