#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/CredentialTable.h"
#include "hotspot/Hs20Network.h"

namespace vexa {

/// Which stored credentials may be used on a network, by realm and EAP method. Converts the credentials'
/// texts once, so that one object serves all networks of a round. Valid as long as the lock is held.
class CredentialMatcher {
public:
    explicit CredentialMatcher(const CredentialTable& table) REQUIRES(g_hs20Lock);
    CredentialMatcher(const CredentialMatcher&) = delete;
    CredentialMatcher& operator=(const CredentialMatcher&) = delete;

    /// By ascending priority, table order among equals.
    std::vector<const Credential*> findCredentialsForNetwork(const Hs20Network& network) const
        REQUIRES(g_hs20Lock);

private:
    struct Candidate {
        const Credential* credential;
        std::string realm;
    };
    std::vector<Candidate> m_candidates;  // in the order in which they are found
    std::unordered_map<std::string_view, std::vector<std::size_t>> m_byRealm;
};

/// Whether a list of domain names of a network holds the home service provider of any stored credential.
bool isHomeSpNetwork(const CredentialTable& table, const ByteBuffer& domainNames) REQUIRES(g_hs20Lock);

/// Whether an ANQP Domain Name list holds this name; case doesn't count.
bool domainNameMatch(const ByteBuffer& domainNames, std::string_view name);

/// The credential of the smallest priority whose roaming consortium the network announces; null if none fits.
const Credential* findRoamingConsortiumCredential(const CredentialTable& table, const Hs20Network& network)
    REQUIRES(g_hs20Lock);

/// Whether a Roaming Consortium element (id, length, body) names this organisation.
bool roamingConsortiumElementMatch(Bytes element, std::string_view id);

}  // namespace vexa
