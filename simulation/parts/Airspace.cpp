#include "simulation/parts/Airspace.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

namespace {

bool isSame(std::span<const std::uint8_t> a, std::span<const std::uint8_t> b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end());
}

template <class Change>
void replace(Airspace::Found& network, Change change) {
    const auto changed = std::make_shared<Network>(*network);
    change(*changed);
    network = changed;
}

}  // namespace

Airspace::Airspace(std::vector<Network> networks) {
    for (Network& network : networks)
        m_networks.push_back(std::make_shared<Network>(std::move(network)));
}

std::vector<Airspace::Found> Airspace::visible() const {
    const LockGuard<Mutex> lock(m_mutex);
    std::vector<Found> networks;
    std::copy_if(m_networks.begin(), m_networks.end(), std::back_inserter(networks),
                 [](const Found& network) { return network->visible; });
    return networks;
}

Airspace::Found Airspace::find(std::span<const std::uint8_t> bssid) const {
    const LockGuard<Mutex> lock(m_mutex);
    for (const Found& network : m_networks) {
        if (isSame(network->bssid, bssid)) return network;
    }
    return nullptr;
}

Airspace::Found Airspace::findVisible(std::span<const std::uint8_t> ssid) const {
    const LockGuard<Mutex> lock(m_mutex);
    for (const Found& network : m_networks) {
        if (network->visible && isSame(network->ssid, ssid)) return network;
    }
    return nullptr;
}

bool Airspace::add(Network network) {
    const LockGuard<Mutex> lock(m_mutex);
    if (findLocked(network.bssid)) return false;
    m_networks.push_back(std::make_shared<Network>(std::move(network)));
    return true;
}

bool Airspace::change(const JsonPlace& changes) {
    const Bytes bssid = changes.member("bssid").macAddress();
    const LockGuard<Mutex> lock(m_mutex);
    Found* const found = findLocked(bssid);
    if (found) replace(*found, [&](Network& network) { changeNetwork(changes, network); });
    return found != nullptr;
}

bool Airspace::setVisible(std::span<const std::uint8_t> bssid, bool visible) {
    const LockGuard<Mutex> lock(m_mutex);
    Found* const found = findLocked(bssid);
    if (found) replace(*found, [&](Network& network) { network.visible = visible; });
    return found != nullptr;
}

void Airspace::answerQueries() {
    const LockGuard<Mutex> lock(m_mutex);
    for (Found& found : m_networks)
        if (!found->wasQueried) replace(found, [](Network& network) { network.wasQueried = true; });
}

void Airspace::answerQuery(std::span<const std::uint8_t> bssid) {
    const LockGuard<Mutex> lock(m_mutex);
    Found* const found = findLocked(bssid);
    if (found) replace(*found, [](Network& network) { network.wasQueried = true; });
}

Airspace::Found* Airspace::findLocked(std::span<const std::uint8_t> bssid) {
    const auto found = std::find_if(m_networks.begin(), m_networks.end(),
                                    [&](const Found& network) { return isSame(network->bssid, bssid); });
    return found == m_networks.end() ? nullptr : &*found;
}

}  // namespace vexa::simulation
