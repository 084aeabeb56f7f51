#include "engine/connect_model.h"

#include <algorithm>
#include <optional>

namespace vexa::test {

ConnectModel::ConnectModel(std::vector<ModelCredential> credentials, std::vector<ModelNetwork> networks)
    : m_credentials(std::move(credentials)), m_networks(std::move(networks)) {
    report();
}

void ConnectModel::settle() {
    while (m_connected.empty() && joinBest()) {
    }
}

std::vector<ModelCredential> ConnectModel::matching(const ModelNetwork& network) const {
    std::vector<ModelCredential> found;
    for (const ModelCredential& credential : m_credentials)
        if (credential.realm == network.realm && (credential.isTls ? network.takesTls : network.takesTtls))
            found.push_back(credential);
    return found;
}

bool ConnectModel::isUsable(const ModelCredential& credential, const std::string& ssid) const {
    const auto count = m_counts.find({credential.id, ssid});
    return credential.autoConnect && (count == m_counts.end() || count->second < (credential.isTls ? 1 : 2));
}

// False if nothing is left to try.
bool ConnectModel::joinBest() {
    const ModelNetwork* network = nullptr;
    std::optional<ModelCredential> best;
    const auto placeOf = [this](const ModelCredential& wanted) {
        return std::find_if(m_credentials.begin(), m_credentials.end(),
                            [&](const ModelCredential& c) { return c.id == wanted.id; });
    };
    for (const std::size_t index : m_list) {
        const ModelNetwork& candidate = m_networks[index];
        if (m_blocked.contains(candidate.ssid)) continue;
        for (const ModelCredential& credential : matching(candidate)) {
            if (!isUsable(credential, candidate.ssid)) continue;
            if (!best || placeOf(credential) < placeOf(*best)) {
                best = credential;
                network = &candidate;
            }
            break;
        }
    }
    if (!best) return false;
    const auto held = m_profiles.find(network->ssid);
    if (held == m_profiles.end() || held->second.isForMachine ||
        held->second.credential.isTls != best->isTls) {
        m_profiles[network->ssid] = {*best, false};
        m_counts[{best->id, network->ssid}] = 0;
    }
    ++m_counts[{best->id, network->ssid}];
    const Profile profile = m_profiles[network->ssid];
    if (!attempt(*network, profile) && profile.credential.isTls) attemptWithMachine(*network);
    return true;
}

bool ConnectModel::attempt(const ModelNetwork& network, const Profile& profile) {
    const ModelCredential& credential = profile.credential;
    const std::string id = std::to_string(credential.id);
    m_connected.clear();
    m_requests += network.ssid +
                  (credential.isTls ? " tls ca" + id + (profile.isForMachine ? " machine" : " machineOrUser")
                                    : " ttls u" + id) +
                  "\n";
    const bool isCertificateFine = network.letsInUser || (network.letsInMachineOnly && profile.isForMachine);
    const bool isPasswordFine = network.letsInPassword && credential.id == network.friendId;
    if (!network.isVisible || !(credential.isTls ? isCertificateFine : isPasswordFine)) return false;
    m_connected = network.ssid;
    m_counts[{credential.id, network.ssid}] = 0;
    return true;
}

bool ConnectModel::attemptWithMachine(const ModelNetwork& network) {
    Profile& profile = m_profiles[network.ssid];
    profile.isForMachine = true;
    return attempt(network, profile);
}

void ConnectModel::drop() {
    m_connected.clear();
    settle();
}

void ConnectModel::changeSession() {
    m_counts.clear();
    settle();
}

void ConnectModel::toggleRadio() {
    m_connected.clear();
    m_counts.clear();
    m_blocked.clear();
    settle();
}

void ConnectModel::setVisible(std::size_t network, bool isVisible) {
    m_networks[network].isVisible = isVisible;
    if (!isVisible && m_connected == m_networks[network].ssid) m_connected.clear();
    settle();
}

void ConnectModel::report() {
    m_list.clear();
    for (std::size_t i = 0; i < m_networks.size(); ++i)
        if (m_networks[i].isVisible) m_list.push_back(i);
    std::erase_if(m_counts, [this](const auto& count) {
        return std::none_of(m_list.begin(), m_list.end(),
                            [&](std::size_t i) { return m_networks[i].ssid == count.first.second; });
    });
    settle();
}

// By hand all that fits is tried in turn, whatever was tried before.
void ConnectModel::connect(const std::string& ssid) {
    const auto listed =
        std::find_if(m_list.begin(), m_list.end(), [&](std::size_t i) { return m_networks[i].ssid == ssid; });
    if (listed == m_list.end()) return;
    const ModelNetwork& network = m_networks[*listed];
    m_blocked.erase(ssid);
    for (const ModelCredential& credential : matching(network)) {
        m_profiles[ssid] = {credential, false};
        if (attempt(network, m_profiles[ssid]) || (credential.isTls && attemptWithMachine(network))) break;
    }
    if (matching(network).empty()) {
        m_requests += "plain " + ssid + "\n";
        m_connected.clear();
    }
    settle();
}

void ConnectModel::disconnect() {
    m_blocked.insert(m_connected);
    m_connected.clear();
    settle();
}

void ConnectModel::forgetProfilesOf(int id) {
    std::erase_if(m_profiles, [id](const auto& held) { return held.second.credential.id == id; });
}

void ConnectModel::removeCredential(int id) {
    std::erase_if(m_credentials, [id](const ModelCredential& credential) { return credential.id == id; });
    std::erase_if(m_counts, [id](const auto& count) { return count.first.first == id; });
    forgetProfilesOf(id);
    settle();
}

void ConnectModel::editCredential(int id, bool autoConnect) {
    const auto edited = std::find_if(m_credentials.begin(), m_credentials.end(),
                                     [id](const ModelCredential& credential) { return credential.id == id; });
    if (!edited->autoConnect && autoConnect)
        for (const std::size_t index : m_list)
            for (const ModelCredential& credential : matching(m_networks[index]))
                if (credential.id == id) m_blocked.erase(m_networks[index].ssid);
    edited->autoConnect = autoConnect;
    for (auto& [pair, count] : m_counts)
        if (pair.first == id) count = 0;
    forgetProfilesOf(id);
    settle();
}

// A new one goes to the top.
void ConnectModel::addCredential(const ModelCredential& credential) {
    m_credentials.insert(m_credentials.begin(), credential);
    std::erase_if(m_blocked, [&](const std::string& ssid) {
        return credential.autoConnect && std::any_of(m_list.begin(), m_list.end(), [&](std::size_t index) {
                   const std::vector<ModelCredential> found = matching(m_networks[index]);
                   return m_networks[index].ssid == ssid && !found.empty() &&
                          found.front().id == credential.id;
               });
    });
    settle();
}

}  // namespace vexa::test
