#pragma once

#include <cstdint>
#include <string>

namespace vexa {

/// Numbers of `Credential::m_type`.
inline constexpr std::int32_t CRED_TYPE_EAP_TTLS = 1;
inline constexpr std::int32_t CRED_TYPE_EAP_SIM = 2;
inline constexpr std::int32_t CRED_TYPE_EAP_TLS = 3;

/// Numbers of `Credential::m_accessType`: seen by everybody on the machine, or by its creator alone.
inline constexpr std::int32_t CRED_ACCESS_ALL_USER = 1;
inline constexpr std::int32_t CRED_ACCESS_PER_USER = 2;

/// Numbers of EAP methods everywhere but in `m_type`.
inline constexpr std::int32_t kEapMethodTls = 1;
inline constexpr std::int32_t kEapMethodTtls = 2;

inline constexpr std::int32_t CRED_PRIORITY_HIGHEST = 1;
inline constexpr std::int32_t CRED_PRIORITY_LOWEST = 9999;  // not yet placed

/// One stored credential, as the current user sees it.
struct Credential {
    Credential(std::int32_t id, std::wstring creator, std::int32_t type, std::int32_t accessType);

    std::int32_t m_id;
    std::int32_t m_priority = CRED_PRIORITY_LOWEST;  // 1 is first; 0: none, left alone by all shifting
    /// Given by a table to what it takes in, and kept by copies: two that have one in common hold the same.
    /// 0: no table has had it yet. It stands with the two above: among thousands, they are all that is looked
    /// at.
    std::uint64_t m_edition = 0;
    std::wstring m_creator;
    std::int32_t m_type;
    std::int32_t m_accessType;
    std::int32_t m_eapMethod = 0;
    bool m_bAutoConnect = true;
    std::wstring m_roamingConsortium;  // nothing fills it yet
    std::wstring m_credName;
    std::wstring m_realm;
    std::wstring m_username;  // EAP-TTLS
    std::wstring m_password;  // EAP-TTLS, in clear here and in the file
    std::wstring m_caCert;    // EAP-TLS
    std::wstring m_clientCert;
    std::wstring m_homeSpFqdn;  // nothing fills it yet
};

/// Whether they are equal but for the place, which is not of the credential but of the user's list.
bool holdTheSame(const Credential& a, const Credential& b);

/// What the client wants to be stored. Text is empty where he gave none.
struct CredentialInput {
    std::int32_t id = 0;
    std::int32_t type = 0;
    std::int32_t accessType = 0;
    std::int32_t eapMethod = 0;  // tells what the client's message holds; the stored one follows from `type`
    bool isPrefered = false;
    bool autoConnect = false;
    std::wstring creator;
    std::wstring credName;
    std::wstring realm;
    std::wstring username;
    std::wstring password;
    std::wstring caCert;
    std::wstring clientCert;
};

}  // namespace vexa
