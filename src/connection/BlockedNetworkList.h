#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "base/NetworkListLock.h"
#include "base/TimeValue.h"
#include "config/ResultCodes.h"
#include "hotspot/Hs20NetworkList.h"

namespace vexa {

class CredentialTable;

/// The SSIDs that auto-connect stays away from, because the user left them. They bind nobody else.
class BlockedNetworkList {
public:
    bool isBlocked(const Hs20Network& network) const REQUIRES(g_hs20Lock);

    /// 1 for a new entry; 0 if the SSID stands on the list already, which keeps its entry as it is, or is too
    /// long.
    int blockNetwork(std::string_view ssid, bool byUser) REQUIRES(g_hs20Lock);
    /// True if there was an entry.
    bool unblockNetwork(std::string_view ssid) REQUIRES(g_hs20Lock);

    /// A credential can open the networks that it fits: a new one, and one that may now be used for
    /// auto-connect. kSuccess, kFailure, or kInvalidArgument for a negative id.
    ResultCode onCredentialAdded(std::int32_t credId, const CredentialTable& credentials,
                                 const Hs20NetworkList& networks) REQUIRES(g_hs20Lock);
    ResultCode onCredentialAutoConnectChanged(std::int32_t credId, const CredentialTable& credentials,
                                              const Hs20NetworkList& networks) REQUIRES(g_hs20Lock);

    /// Opens what was blocked a moment ago, and not by the client: it was no act of the user.
    void unblockRecentNetworks() REQUIRES(g_hs20Lock);

    void clear() REQUIRES(g_hs20Lock) { m_networks.clear(); }

private:
    struct BlockedNetwork {
        std::string ssid;
        TimeValue blockedTime;
        bool bBlockedByUser;
    };

    std::vector<BlockedNetwork>::iterator find(std::string_view ssid) REQUIRES(g_hs20Lock);

    std::vector<BlockedNetwork> m_networks GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
