#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "base/NetworkListLock.h"
#include "hotspot/Hs20Network.h"

namespace vexa {

/// The networks in range, in the order of the module's last report.
class Hs20NetworkList {
public:
    using Networks = std::vector<std::unique_ptr<Hs20Network>>;

    /// Null if there is none. `findBySsid` gives the first network whose SSID begins with these bytes; none
    /// for no bytes.
    Hs20Network* findByMac(const MacAddress& mac) const REQUIRES(g_hs20Lock);
    Hs20Network* findBySsid(std::string_view ssid) const REQUIRES(g_hs20Lock);

    /// The SSID of the network that clients know by this name; the name itself if there is none.
    std::string ssidShownAs(std::string_view name) const REQUIRES(g_hs20Lock);

    /// In order. Good only while the lock is held.
    std::vector<Hs20Network*> copyPointers() const REQUIRES(g_hs20Lock);
    std::size_t size() const REQUIRES(g_hs20Lock) { return m_networks.size(); }
    std::vector<MacAddress> macAddresses() const REQUIRES(g_hs20Lock);

    /// To be worked on aside.
    Hs20NetworkList copy() const REQUIRES(g_hs20Lock);

    /// Takes over a report: networks known by their MAC address stay, the others are new. Gives those that
    /// were not reported any more.
    Networks replace(const std::vector<Hs20BssRecord>& records) REQUIRES(g_hs20Lock);

    /// Folds the networks that share an SSID into one that has the realms of them all: the first that was
    /// known before
    /// (`oldMacs`), else the first.
    void processDuplicatedHs20Networks(const std::vector<MacAddress>& oldMacs) REQUIRES(g_hs20Lock);

private:
    Networks m_networks GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
