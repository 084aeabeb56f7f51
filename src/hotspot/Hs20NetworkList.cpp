#include "hotspot/Hs20NetworkList.h"

#include <algorithm>
#include <deque>
#include <map>
#include <set>
#include <string>
#include <utility>

#include "base/DiagnosticLog.h"
#include "hotspot/RealmCollection.h"
#include "hotspot/ShownName.h"
#include "text/OutOfMemory.h"

namespace vexa {

namespace {

using Group = std::vector<Hs20Network*>;

void updateKnown(Hs20Network& network, const Hs20BssRecord& record) {
    Log(3, "There already exists a network with ssid=%s, updating network info....", record.ssid.c_str());
    const bool isHs20 = record.isHs20 == 1;
    if (network.m_bHs20 != isHs20) {
        Log(3, "The HS20 attribute has been changed for this network.");
        network.m_bHs20 = isHs20;
    }
    network.m_networkType = record.networkType;
    network.m_internetAccess = record.internetAccess;
}

std::unique_ptr<Hs20Network> buildNew(const Hs20BssRecord& record) {
    Log(3, "We scanned a new HS20 network with ssid=%s, adding to the network list...", record.ssid.c_str());
    auto network = std::make_unique<Hs20Network>(record);
    Log(3, "\tssid=%s", network->ssidText().c_str());
    return network;
}

std::vector<RealmInfo> unionOfRealms(const Group& group) {
    RealmCollection all;
    std::set<RealmInfo> seen;
    for (const Hs20Network* network : group) {
        Log(3, "\tMacAddress=%s", toText(network->m_macAddress).c_str());
        for (const RealmInfo& realm : network->m_realms)
            if (!all.isFull() && seen.insert(realm).second) all.add(realm);
    }
    return all.take();
}

Hs20Network* networkToKeep(const Group& group, const std::set<MacAddress>& oldMacs) {
    const auto known = std::find_if(group.begin(), group.end(), [&](const Hs20Network* network) {
        return oldMacs.contains(network->m_macAddress);
    });
    return known == group.end() ? group.front() : *known;
}

}  // namespace

Hs20Network* Hs20NetworkList::findByMac(const MacAddress& mac) const {
    const auto found = std::find_if(m_networks.begin(), m_networks.end(),
                                    [&](const auto& network) { return network->m_macAddress == mac; });
    return found == m_networks.end() ? nullptr : found->get();
}

Hs20Network* Hs20NetworkList::findBySsid(std::string_view ssid) const {
    if (ssid.empty()) return nullptr;
    const auto found = std::find_if(m_networks.begin(), m_networks.end(), [&](const auto& network) {
        return std::string_view(network->m_ssid.data(), network->m_ssid.size()).starts_with(ssid);
    });
    return found == m_networks.end() ? nullptr : found->get();
}

std::string Hs20NetworkList::ssidShownAs(std::string_view name) const {
    const auto found = std::find_if(m_networks.begin(), m_networks.end(), [&](const auto& network) {
        return shownName(network->ssidText()) == name;
    });
    return std::string(found == m_networks.end() ? name : (*found)->ssid());
}

Hs20NetworkList Hs20NetworkList::copy() const {
    Hs20NetworkList copy;
    for (const auto& network : m_networks)
        copy.m_networks.push_back(std::make_unique<Hs20Network>(*network));
    return copy;
}

std::vector<Hs20Network*> Hs20NetworkList::copyPointers() const {
    std::vector<Hs20Network*> pointers;
    pointers.reserve(m_networks.size());
    for (const auto& network : m_networks)
        pointers.push_back(network.get());
    return pointers;
}

std::vector<MacAddress> Hs20NetworkList::macAddresses() const {
    std::vector<MacAddress> addresses;
    addresses.reserve(m_networks.size());
    for (const auto& network : m_networks)
        addresses.push_back(network->m_macAddress);
    return addresses;
}

Hs20NetworkList::Networks Hs20NetworkList::replace(const std::vector<Hs20BssRecord>& records) {
    std::map<MacAddress, std::deque<std::unique_ptr<Hs20Network>>> known;
    for (auto& network : m_networks)
        known[network->m_macAddress].push_back(std::move(network));
    Networks updated;
    updated.reserve(records.size());
    for (const Hs20BssRecord& record : records) {
        const auto found = known.find(record.macAddress);
        if (found == known.end() || found->second.empty()) {
            if (!withinMemory([&] { updated.push_back(buildNew(record)); }))
                Log(6, "ERROR: Invalid HS20 network pointer.");
            continue;
        }
        updated.push_back(std::move(found->second.front()));
        found->second.pop_front();
        updateKnown(*updated.back(), record);
    }
    m_networks = std::move(updated);
    Networks gone;
    for (auto& [mac, networks] : known)
        for (auto& network : networks)
            gone.push_back(std::move(network));
    return gone;
}

void Hs20NetworkList::processDuplicatedHs20Networks(const std::vector<MacAddress>& oldMacs) {
    Log(3, "Processing duplicated HS20 networks...");
    const std::set<MacAddress> known(oldMacs.begin(), oldMacs.end());
    std::map<std::string_view, Group> groups;
    for (const auto& network : m_networks)
        groups[network->ssid()].push_back(network.get());
    std::erase_if(groups, [](const auto& entry) { return entry.second.size() < 2; });

    std::map<const Hs20Network*, std::vector<RealmInfo>> realms;
    for (const auto& [ssid, group] : groups) {
        Log(3, "Found duplicate HS20 networks with same ssid=%s", group.front()->ssidText().c_str());
        realms[networkToKeep(group, known)] = unionOfRealms(group);
    }
    std::set<const Hs20Network*> dropped;
    for (const auto& [ssid, group] : groups) {
        Hs20Network* const kept = networkToKeep(group, known);
        kept->takeRealmsOfAll(std::move(realms[kept]));
        for (std::size_t index = 0; index < group.size(); ++index)
            if (group[index] == kept)
                Log(3, "This network with index=%d and mac address%s exists before, thus we will keep it.",
                    static_cast<int>(index), toText(kept->m_macAddress).c_str());
            else
                dropped.insert(group[index]);
    }
    std::erase_if(m_networks, [&](const auto& network) { return dropped.contains(network.get()); });
}

}  // namespace vexa
