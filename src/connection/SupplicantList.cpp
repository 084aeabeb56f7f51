#include <algorithm>
#include <utility>

#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"

namespace vexa {

namespace {

using platform::LockGuard;

constexpr std::size_t kLeastAnqpPayload = 44;

}  // namespace

ResultCode Supplicant::updateHs20NetworkList(const std::vector<Hs20BssRecord>& records) {
    if (records.empty()) return kInvalidArgument;
    const LockGuard lock(g_hs20Lock);
    const std::vector<MacAddress> oldMacs = m_engine.m_networkList.macAddresses();
    // Made aside: if memory runs out half way, the list stands as it was.
    Hs20NetworkList updated = m_engine.m_networkList.copy();
    updated.replace(records);
    for (Hs20Network* network : updated.copyPointers())
        if (fetchBssAnqpInfo(*network) != kSuccess) Log(3, "Fetch ANQP info failed.");
    updated.processDuplicatedHs20Networks(oldMacs);
    std::swap(m_engine.m_networkList, updated);
    Log(3, "\tSet events m_hHs20NetworkChangedEvent and m_hAnqpInfoReadyEvent.");
    m_engine.m_hHs20NetworkChangedEvent.set();
    m_engine.m_hAnqpInfoReadyEvent.set();
    m_engine.m_retryHelper.eraseUnavailableNetworks(m_engine.m_networkList);
    if (m_engine.m_networkList.size() > oldMacs.size() && isHs20Enabled())
        tellClient([](const ClientEvents& events) { events.sendDetectedHotspot(); });
    sendNetworkList();
    return kSuccess;
}

Hs20Network* Supplicant::getConnectedBss(bool includeConnecting) const {
    const auto connection = m_wlan.queryCurrentConnection(includeConnecting);
    return connection ? m_engine.m_networkList.findBySsid(bytesOf(connection->ssid)) : nullptr;
}

void Supplicant::sendNetworkList() {
    tellClient([this](const ClientEvents& events) { events.sendNetworkList(*this); });
}

bool Supplicant::hasUnfetchedAnqpInfo() const {
    const LockGuard lock(g_hs20Lock);
    const auto networks = m_engine.m_networkList.copyPointers();
    return std::any_of(networks.begin(), networks.end(),
                       [](const Hs20Network* network) { return !network->hasRealmData(); });
}

ResultCode Supplicant::onNetworkListChanged(Bytes payload) {
    Log(3, "IHV reports HS20 network list changed.");
    if (updateHs20NetworkList(parseBssRecords(payload)) == kSuccess) return kSuccess;
    Log(6, "ERROR: Update HS20 network list failed.");
    return kFailure;
}

ResultCode Supplicant::onAnqpInfoChanged(Bytes payload) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "IHV reports HS20 BSS ANQP info changed.");
    if (payload.size() < kLeastAnqpPayload) return kFailure;
    const Hs20BssRecord record = parseBssRecord(payload);
    if (record.isHs20 != 1) return kSuccess;
    Hs20Network* const network = m_engine.m_networkList.findByMac(record.macAddress);
    if (network == nullptr) return kFailure;
    return fetchBssAnqpInfo(*network);
}

// After a failed fetch the query counts as running: the connecting thread must not connect on what it knew
// before.
// Under one lock: the list wakes the connecting thread, which must find the query ended when it comes to it.
void Supplicant::onAnqpQueryCompleted() {
    const LockGuard lock(g_hs20Lock);
    Log(3, "IHV reports HS20 network query ANQP info completed.");
    if (getHs20BssListFromIHV() != kSuccess) {
        Log(6, "Error: getHs20BssListFromIHV failed in hs20Associate.");
        return;
    }
    if (!m_engine.m_bQueryingAnqp) return;
    Log(3, "ANQP querying finished.");
    m_engine.m_bQueryingAnqp = false;
}

}  // namespace vexa
