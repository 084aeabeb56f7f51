#include "simulation/parts/Airspace.h"

#include <algorithm>

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

namespace {

bool isSame(std::span<const std::uint8_t> a, std::span<const std::uint8_t> b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end());
}

}  // namespace

Airspace::Airspace(std::vector<Network> networks) : m_networks(std::move(networks)) {}

std::vector<Network> Airspace::visible() const {
    const LockGuard<Mutex> lock(m_mutex);
    std::vector<Network> networks;
    std::copy_if(m_networks.begin(), m_networks.end(), std::back_inserter(networks),
                 [](const Network& network) { return network.visible; });
    return networks;
}

std::optional<Network> Airspace::find(std::span<const std::uint8_t> bssid) const {
    const LockGuard<Mutex> lock(m_mutex);
    for (const Network& network : m_networks) {
        if (isSame(network.bssid, bssid)) return network;
    }
    return std::nullopt;
}

std::optional<Network> Airspace::findVisible(std::span<const std::uint8_t> ssid) const {
    const LockGuard<Mutex> lock(m_mutex);
    for (const Network& network : m_networks) {
        if (network.visible && isSame(network.ssid, ssid)) return network;
    }
    return std::nullopt;
}

bool Airspace::add(Network network) {
    const LockGuard<Mutex> lock(m_mutex);
    if (findLocked(network.bssid)) return false;
    m_networks.push_back(std::move(network));
    return true;
}

bool Airspace::change(const JsonPlace& changes) {
    const Bytes bssid = changes.member("bssid").macAddress();
    const LockGuard<Mutex> lock(m_mutex);
    Network* const network = findLocked(bssid);
    if (network) changeNetwork(changes, *network);
    return network != nullptr;
}

bool Airspace::setVisible(std::span<const std::uint8_t> bssid, bool visible) {
    const LockGuard<Mutex> lock(m_mutex);
    Network* const network = findLocked(bssid);
    if (network) network->visible = visible;
    return network != nullptr;
}

void Airspace::answerQueries() {
    const LockGuard<Mutex> lock(m_mutex);
    for (Network& network : m_networks)
        network.wasQueried = true;
}

void Airspace::answerQuery(std::span<const std::uint8_t> bssid) {
    const LockGuard<Mutex> lock(m_mutex);
    if (Network* const network = findLocked(bssid)) network->wasQueried = true;
}

Network* Airspace::findLocked(std::span<const std::uint8_t> bssid) {
    const auto found = std::find_if(m_networks.begin(), m_networks.end(),
                                    [&](const Network& network) { return isSame(network.bssid, bssid); });
    return found == m_networks.end() ? nullptr : &*found;
}

}  // namespace vexa::simulation
