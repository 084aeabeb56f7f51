#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "base/NetworkListLock.h"
#include "hotspot/IhvMessages.h"
#include "hotspot/RealmList.h"
#include "platform/WlanApi.h"

namespace vexa {

/// The raw bytes of one ANQP element; empty if nothing was stored.
using ByteBuffer = std::vector<std::byte>;

/// The bytes of an SSID; none if its length is impossible.
std::string_view bytesOf(const DOT11_SSID& ssid);

/// One network in range. After folding there is one for each SSID.
class Hs20Network {
public:
    explicit Hs20Network(const Hs20BssRecord& record);

    /// The SSID's bytes, and as text up to its first NUL.
    std::string_view ssid() const { return {m_ssid.data(), m_ssidLength}; }
    std::string ssidText() const { return std::string(ssid().substr(0, ssid().find('\0'))); }

    bool hasRealmData() const { return !m_anqpNaiRealm.empty(); }

    /// What the module is asked about.
    Hs20BssRecord record() const;

    /// Turns m_anqpNaiRealm into m_realms. Data that can't be parsed leaves the realms as they were.
    void parseRealmList() REQUIRES(g_hs20Lock);

    /// Stores the data and parses it. What is known already is only parsed to be told to the log.
    void takeRealmList(Bytes data) REQUIRES(g_hs20Lock);
    /// Those of all networks that share the SSID.
    void takeRealmsOfAll(RealmList realms) REQUIRES(g_hs20Lock);

    bool m_bHs20;
    MacAddress m_macAddress;
    std::uint8_t m_ssidLength;
    std::array<char, kMaxSsidLength> m_ssid{};
    std::uint32_t m_networkType;
    std::uint32_t m_internetAccess;
    RealmList m_realms;
    ByteBuffer m_anqpNaiRealm;

    // Read by the matching of credentials; nothing fills them yet.
    ByteBuffer m_ies;
    ByteBuffer m_anqpRoamingConsortium;
    ByteBuffer m_anqpDomainName;

private:
    bool m_isParsed = false;  // the realms are those of the data, no more and no less
};

}  // namespace vexa
