#include "hotspot/Hs20Network.h"

#include <algorithm>
#include <cstring>
#include <new>
#include <utility>

#include "base/DiagnosticLog.h"

namespace vexa {

std::string_view bytesOf(const DOT11_SSID& ssid) {
    if (ssid.uSSIDLength > kMaxSsidLength) return {};
    return {reinterpret_cast<const char*>(ssid.ucSSID), ssid.uSSIDLength};
}

Hs20Network::Hs20Network(const Hs20BssRecord& record)
    : m_bHs20(record.isHs20 == 1),
      m_macAddress(record.macAddress),
      m_ssidLength(static_cast<std::uint8_t>(std::min<std::size_t>(record.ssid.size(), kMaxSsidLength))),
      m_networkType(record.networkType),
      m_internetAccess(record.internetAccess) {
    std::copy_n(record.ssid.begin(), m_ssidLength, m_ssid.begin());
}

Hs20BssRecord Hs20Network::record() const {
    return {m_macAddress, std::string(ssid()), 1, m_networkType, m_internetAccess};
}

// Running out of memory is as good as bad data.
void Hs20Network::parseRealmList() try {
    Log(3, "Parsing NAI Realm list from %s", toText(m_macAddress).c_str());
    if (!hasRealmData()) {
        Log(3, "The NAI realm buffer is empty, nothing will be parsed.");
        return;
    }
    Log(3, "\tParsing NAI Realm...");
    const auto realms = parseNaiRealmList(m_anqpNaiRealm);
    if (!realms) return;
    m_realms = flattenRealms(*realms);
    m_isParsed = true;
    Log(3, "\tWe have parsed %d realms:", static_cast<int>(m_realms.size()));
    for (const RealmInfo& realm : m_realms)
        Log(3, "\t\t%s %s", realm.m_realm.c_str(), realm.m_eapType == 2 ? "EAP-TTLS" : "EAP-TLS");
} catch (const std::bad_alloc&) {
    return;
}

void Hs20Network::takeRealmList(Bytes data) {
    const bool isKnown = data.size() == m_anqpNaiRealm.size() &&
                         std::memcmp(data.data(), m_anqpNaiRealm.data(), data.size()) == 0;
    if (isKnown && m_isParsed && !DiagnosticLog::isEnabled()) return;
    m_isParsed = false;
    m_anqpNaiRealm.assign(data.begin(), data.end());
    parseRealmList();
}

void Hs20Network::takeRealmsOfAll(RealmList realms) {
    m_isParsed = false;
    m_realms = std::move(realms);
}

}  // namespace vexa
