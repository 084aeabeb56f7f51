#pragma once

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "engine/world/StoreStory.h"

namespace vexa::test {

/// What a random story is played with, beside credentials.
struct ModelNetwork {
    std::string ssid;
    std::string realm;
    bool takesTls;
    bool takesTtls;
    bool letsInPassword;     ///< of the credential `friendId` alone
    bool letsInUser;         ///< a certificate in either mode
    bool letsInMachineOnly;  ///< a certificate of the machine
    int friendId;
    bool isVisible = true;

    bool fits(const StoredCredential& credential) const {
        return credential.realm == realm && (credential.isTls ? takesTls : takesTtls);
    }
};

/// A small model of which network is asked for with which credential. It knows no threads and no time: what
/// happens by itself behind an operation is done by settle().
class ConnectModel {
public:
    ConnectModel(std::vector<StoredCredential> credentials, std::vector<ModelNetwork> networks)
        : m_credentials(std::move(credentials)), m_networks(std::move(networks)) {
        report();
    }

    void settle() {
        while (m_connected.empty() && joinBest()) {
        }
    }

    void drop() { m_connected.clear(); }
    void changeSession() { m_counts.clear(); }

    void toggleRadio() {
        m_connected.clear();
        m_counts.clear();
        m_blocked.clear();
    }

    void setVisible(std::size_t network, bool isVisible) {
        m_networks[network].isVisible = isVisible;
        if (!isVisible && m_connected == m_networks[network].ssid) m_connected.clear();
    }

    void report() {
        m_list.clear();
        for (const ModelNetwork& network : m_networks)
            if (network.isVisible) m_list.push_back(&network);
        std::erase_if(m_counts, [this](const auto& count) { return listed(count.first.second) == nullptr; });
    }

    // By hand all that fits is tried in turn, whatever was tried before.
    void connect(const std::string& ssid) {
        const ModelNetwork* const network = listed(ssid);
        if (network == nullptr) return;
        m_blocked.erase(ssid);
        bool isAnyTried = false;
        for (const StoredCredential& credential : m_credentials) {
            if (!network->fits(credential)) continue;
            isAnyTried = true;
            m_profiles[ssid] = {credential, false};
            if (attempt(*network)) return;
        }
        if (isAnyTried) return;
        m_requests.push_back("plain " + ssid);
        m_connected.clear();
    }

    void disconnect() {
        m_blocked.insert(m_connected);
        m_connected.clear();
    }

    void removeCredential(int id) {
        std::erase_if(m_credentials, [id](const auto& credential) { return credential.id == id; });
        std::erase_if(m_counts, [id](const auto& count) { return count.first.first == id; });
        forgetProfilesOf(id);
    }

    void editCredential(int id, bool autoConnect) {
        const auto edited = std::find_if(m_credentials.begin(), m_credentials.end(),
                                         [id](const auto& credential) { return credential.id == id; });
        if (!edited->autoConnect && autoConnect)
            for (const ModelNetwork* const network : m_list)
                if (network->fits(*edited)) m_blocked.erase(network->ssid);
        edited->autoConnect = autoConnect;
        for (auto& [pair, count] : m_counts)
            if (pair.first == id) count = 0;
        forgetProfilesOf(id);
    }

    // A new one goes to the top.
    void addCredential(const StoredCredential& credential) {
        m_credentials.insert(m_credentials.begin(), credential);
        std::erase_if(m_blocked, [&](const std::string& ssid) {
            const ModelNetwork* const network = listed(ssid);
            return credential.autoConnect && network != nullptr && network->fits(credential);
        });
    }

    /// All requests so far.
    const std::vector<std::string>& requests() const { return m_requests; }
    const std::string& connected() const { return m_connected; }
    const std::vector<ModelNetwork>& networks() const { return m_networks; }
    const std::vector<StoredCredential>& credentials() const { return m_credentials; }

private:
    struct Profile {
        StoredCredential credential;
        bool isForMachine;
    };

    const ModelNetwork* listed(const std::string& ssid) const {
        const auto found = std::find_if(m_list.begin(), m_list.end(),
                                        [&](const ModelNetwork* network) { return network->ssid == ssid; });
        return found == m_list.end() ? nullptr : *found;
    }

    bool isUsable(const StoredCredential& credential, const ModelNetwork& network) const {
        if (!credential.autoConnect || !network.fits(credential) || m_blocked.contains(network.ssid))
            return false;
        const auto count = m_counts.find({credential.id, network.ssid});
        return count == m_counts.end() || count->second < (credential.isTls ? 1 : 2);
    }

    // False if nothing is left to try.
    bool joinBest() {
        for (const StoredCredential& credential : m_credentials)
            for (const ModelNetwork* const network : m_list)
                if (isUsable(credential, *network)) {
                    join(*network, credential);
                    return true;
                }
        return false;
    }

    void join(const ModelNetwork& network, const StoredCredential& credential) {
        const auto held = m_profiles.find(network.ssid);
        int& count = m_counts[{credential.id, network.ssid}];
        if (held == m_profiles.end() || held->second.isForMachine ||
            held->second.credential.isTls != credential.isTls) {
            m_profiles[network.ssid] = {credential, false};
            count = 0;
        }
        ++count;
        attempt(network);
    }

    // With the profile that the network has; a certificate has a second try as the machine's.
    bool attempt(const ModelNetwork& network) {
        Profile& profile = m_profiles[network.ssid];
        const StoredCredential credential = profile.credential;
        const std::string id = std::to_string(credential.id);
        m_connected.clear();
        const std::string mode = profile.isForMachine ? " machine" : " machineOrUser";
        m_requests.push_back(network.ssid + (credential.isTls ? " tls ca" + id + mode : " ttls u" + id));
        const bool isTlsFine = network.letsInUser || (network.letsInMachineOnly && profile.isForMachine);
        const bool isPasswordFine = network.letsInPassword && credential.id == network.friendId;
        if (network.isVisible && (credential.isTls ? isTlsFine : isPasswordFine)) {
            m_connected = network.ssid;
            m_counts[{credential.id, network.ssid}] = 0;
            return true;
        }
        if (!credential.isTls || profile.isForMachine) return false;
        profile.isForMachine = true;
        return attempt(network);
    }

    void forgetProfilesOf(int id) {
        std::erase_if(m_profiles, [id](const auto& held) { return held.second.credential.id == id; });
    }

    std::vector<StoredCredential> m_credentials;  // the best first
    std::vector<ModelNetwork> m_networks;         // what is in the air
    std::vector<const ModelNetwork*> m_list;      // what was reported last
    std::map<std::pair<int, std::string>, int> m_counts;
    std::map<std::string, Profile> m_profiles;
    std::set<std::string> m_blocked;
    std::string m_connected;
    std::vector<std::string> m_requests;
};

}  // namespace vexa::test
