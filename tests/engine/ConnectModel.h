#pragma once

#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace vexa::test {

/// What a random story is played with.
struct ModelCredential {
    int id;
    char realm;
    bool isTls;
    bool autoConnect;
};

struct ModelNetwork {
    std::string ssid;
    char realm;
    bool takesTls;
    bool takesTtls;
    bool letsInPassword;     ///< of the credential `friendId` alone
    bool letsInUser;         ///< a certificate in either mode
    bool letsInMachineOnly;  ///< a certificate of the machine
    int friendId;
    bool isVisible = true;
};

/// A small model of which network is asked for with which credential. It knows no threads and no time: each
/// operation runs until nothing more would happen by itself.
class ConnectModel {
public:
    ConnectModel(std::vector<ModelCredential> credentials, std::vector<ModelNetwork> networks);

    void settle();
    void drop();
    void changeSession();
    void toggleRadio();
    void setVisible(std::size_t network, bool isVisible);
    void report();
    void connect(const std::string& ssid);
    void disconnect();
    void removeCredential(int id);
    void editCredential(int id, bool autoConnect);
    void addCredential(const ModelCredential& credential);

    /// All requests so far.
    const std::vector<std::string>& requests() const { return m_requests; }
    const std::string& connected() const { return m_connected; }
    const std::vector<ModelNetwork>& networks() const { return m_networks; }
    const std::vector<ModelCredential>& credentials() const { return m_credentials; }

private:
    struct Profile {
        ModelCredential credential;
        bool isForMachine;
    };
    using Pair = std::pair<int, std::string>;

    std::vector<ModelCredential> matching(const ModelNetwork& network) const;
    bool isUsable(const ModelCredential& credential, const ModelNetwork& network) const;
    bool joinBest();
    void join(const ModelNetwork& network, const ModelCredential& credential);
    bool attempt(const ModelNetwork& network, const Profile& profile);
    bool attemptWithMachine(const ModelNetwork& network);
    void forgetProfilesOf(int id);

    std::vector<ModelCredential> m_credentials;  // the best first
    std::vector<ModelNetwork> m_networks;        // what is in the air
    std::vector<std::size_t> m_list;             // what was reported last
    std::map<Pair, int> m_counts;
    std::map<std::string, Profile> m_profiles;
    std::set<std::string> m_blocked;
    std::string m_connected;
    std::vector<std::string> m_requests;
};

}  // namespace vexa::test
