#include "engine/ConnectModel.h"

#include <algorithm>
#include <iterator>

namespace vexa::test {

namespace {

bool fits(const ModelCredential& credential, const ModelNetwork& network) {
    return credential.realm == network.realm && (credential.isTls ? network.takesTls : network.takesTtls);
}

}  // namespace

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
    std::copy_if(m_credentials.begin(), m_credentials.end(), std::back_inserter(found),
                 [&](const ModelCredential& credential) { return fits(credential, network); });
    return found;
}

bool ConnectModel::isUsable(const ModelCredential& credential, const ModelNetwork& network) const {
    if (!credential.autoConnect || !fits(credential, network) || m_blocked.contains(network.ssid))
        return false;
    const auto count = m_counts.find({credential.id, network.ssid});
    return count == m_counts.end() || count->second < (credential.isTls ? 1 : 2);
}

// False if nothing is left to try.
bool ConnectModel::joinBest() {
    for (const ModelCredential& credential : m_credentials)
        for (const std::size_t index : m_list)
            if (isUsable(credential, m_networks[index])) {
                join(m_networks[index], credential);
                return true;
            }
    return false;
}

void ConnectModel::join(const ModelNetwork& network, const ModelCredential& credential) {
    const auto held = m_profiles.find(network.ssid);
    int& count = m_counts[{credential.id, network.ssid}];
    if (held == m_profiles.end() || held->second.isForMachine ||
        held->second.credential.isTls != credential.isTls) {
        m_profiles[network.ssid] = {credential, false};
        count = 0;
    }
    ++count;
    const Profile profile = m_profiles[network.ssid];
    if (!attempt(network, profile) && profile.credential.isTls) attemptWithMachine(network);
}

bool ConnectModel::attempt(const ModelNetwork& network, const Profile& profile) {
    const ModelCredential& credential = profile.credential;
    const std::string id = std::to_string(credential.id);
    m_connected.clear();
    m_requests.push_back(network.ssid +
                         (credential.isTls
                              ? " tls ca" + id + (profile.isForMachine ? " machine" : " machineOrUser")
                              : " ttls u" + id));
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
        m_requests.push_back("plain " + ssid);
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
