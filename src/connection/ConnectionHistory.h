#pragma once

#include <vector>

#include "base/NetworkListLock.h"
#include "base/TimeValue.h"
#include "config/ResultCodes.h"
#include "hotspot/IhvMessages.h"
#include "platform/WlanApi.h"

namespace vexa {

class Hs20NetworkList;

inline constexpr std::size_t CONNECTION_HISTORY_CAPACITY = 50;

/// One connection to a Hotspot 2.0 network.
struct ConnectionRecord {
    TimeValue m_connectedTime;
    TimeValue m_disconnectedTime;
    bool m_bDisconnectedTimeValid = false;  // false while the connection is open
    MacAddress m_macAddress{};
    DOT11_SSID m_ssid{};
};

/// The recent connections, oldest first. Only in memory; one more than its capacity wipes those before it.
class ConnectionHistory {
public:
    /// kSuccess, also for a network that isn't in the list and leaves no record.
    ResultCode addConnection(const DOT11_SSID& ssid, const MacAddress& mac, const Hs20NetworkList& networks)
        REQUIRES(g_hs20Lock);
    /// kFailure: the last record belongs to another SSID, or to one with other bytes behind its end.
    ResultCode updateDisconnection(const DOT11_SSID& ssid, const Hs20NetworkList& networks)
        REQUIRES(g_hs20Lock);

    /// The newest record; null if there is none.
    const ConnectionRecord* last() const REQUIRES(g_hs20Lock);

private:
    void dump() const REQUIRES(g_hs20Lock);

    std::vector<ConnectionRecord> m_records GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
