#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <string_view>
#include <unordered_map>

#include "base/NetworkListLock.h"

namespace vexa {

class CredentialTable;
class Hs20NetworkList;

/// Counts how often auto-connect has tried a credential on an SSID, and says when it is enough: once with
/// EAP-TLS, twice with EAP-TTLS. A pair without a count has 0. Ids below 1 and empty SSIDs do nothing.
class NetworkRetryHelper {
public:
    bool isRetryAllowed(const CredentialTable& credentials, std::int32_t credId, std::string_view ssid) const
        REQUIRES(g_hs20Lock);
    std::uint32_t getNumRetries(std::int32_t credId, std::string_view ssid) const REQUIRES(g_hs20Lock);
    void setNumRetries(std::int32_t credId, std::string_view ssid, std::uint32_t count) REQUIRES(g_hs20Lock);
    void increaseNumRetries(std::int32_t credId, std::string_view ssid) REQUIRES(g_hs20Lock);

    /// Forget one pair, all of a credential, or all whose network is not in range any more.
    void removeNumRetryEntries(std::int32_t credId, std::string_view ssid) REQUIRES(g_hs20Lock);
    void removeAllCredNumRetryEntries(std::int32_t credId) REQUIRES(g_hs20Lock);
    void eraseUnavailableNetworks(const Hs20NetworkList& networks) REQUIRES(g_hs20Lock);
    void clear() REQUIRES(g_hs20Lock) { m_cred2ssid.clear(); }

    /// Back to 0: of a credential, or of all. The entries stay.
    void resetNumRetries(std::int32_t credId) REQUIRES(g_hs20Lock);
    void resetAllNumRetries() REQUIRES(g_hs20Lock);

private:
    struct Entry {
        std::uint32_t numRetries;
        std::uint64_t number;  // counts the entries, in the order in which they were made
    };
    using EntriesBySsid = std::map<std::string, Entry, std::less<>>;

    Entry* entryOf(std::int32_t credId, std::string_view ssid) REQUIRES(g_hs20Lock);

    std::unordered_map<std::int32_t, EntriesBySsid> m_cred2ssid GUARDED_BY(g_hs20Lock);
    std::uint64_t m_lastNumber GUARDED_BY(g_hs20Lock) = 0;
};

}  // namespace vexa
