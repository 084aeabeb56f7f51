#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <random>

#include "engine/ConnectModel.h"
#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

using Random = std::mt19937_64;

bool chance(Random& random, int percent) {
    return static_cast<int>(random() % 100) < percent;
}

std::string someRealm(Random& random) {
    return random() % 2 == 0 ? "a.example" : "b.example";
}

StoredCredential someCredential(Random& random, int id) {
    const std::string realm = someRealm(random);
    const bool isTls = chance(random, 40);
    return {.id = id, .realm = realm, .isTls = isTls, .autoConnect = chance(random, 80)};
}

std::vector<StoredCredential> someCredentials(Random& random) {
    std::vector<StoredCredential> credentials;
    const int count = 1 + static_cast<int>(random() % 5);
    for (int id = 1; id <= count; ++id)
        credentials.push_back(someCredential(random, id));
    std::shuffle(credentials.begin(), credentials.end(), random);
    return credentials;
}

std::vector<ModelNetwork> someNetworks(Random& random) {
    std::vector<ModelNetwork> networks;
    const std::size_t count = 1 + random() % 4;
    for (std::size_t i = 0; i < count; ++i) {
        ModelNetwork network{};
        network.ssid = std::string("net") + static_cast<char>('A' + i);
        network.realm = someRealm(random);
        network.takesTls = chance(random, 70);
        network.takesTtls = !network.takesTls || chance(random, 70);
        network.letsInPassword = chance(random, 60);
        network.letsInUser = chance(random, 30);
        network.letsInMachineOnly = chance(random, 30);
        network.friendId = 1 + static_cast<int>(random() % 6);
        network.isVisible = i == 0 || chance(random, 80);
        networks.push_back(network);
    }
    return networks;
}

std::string scenarioOf(const std::vector<StoredCredential>& credentials,
                       const std::vector<ModelNetwork>& networks) {
    std::vector<std::string> air;
    int number = 0;
    for (const ModelNetwork& n : networks) {
        const char* const methods = n.takesTls && n.takesTtls ? "13,21" : n.takesTls ? "13" : "21";
        std::string rules;
        const auto rule = [&rules](const std::string& text) { rules += (rules.empty() ? "" : ",") + text; };
        if (n.letsInPassword) rule(R"({"eapMethod":21,"username":"u)" + std::to_string(n.friendId) + "\"}");
        if (n.letsInUser) rule(R"({"eapMethod":13})");
        if (n.letsInMachineOnly) rule(R"({"eapMethod":13,"authMode":"machine"})");
        air.push_back(network(++number, n.ssid,
                              realms(n.realm, methods) + "," + lettingIn(rules) + R"(,"visible":)" +
                                  (n.isVisible ? "true" : "false")));
    }
    return test::air(air, storing(credentials));
}

std::string credentialData(const StoredCredential& credential) {
    const std::string id = std::to_string(credential.id);
    const std::string members = R"("AccessType":1,"Id":)" + id + R"(,"AutoConnect":)" +
                                (credential.autoConnect ? "true" : "false") + R"(,"CredentialName":"name)" +
                                id + (credential.isTls ? R"(","CaCert":"ca)" : R"(","Username":"u)") + id +
                                "\"";
    return (credential.isTls ? tlsData : ttlsData)(credential.realm, members);
}

/// The same steps for the model and for the machine.
class Play {
public:
    Play(std::uint64_t seed, ConnectModel& model, Story& story)
        : m_random(seed),
          m_model(model),
          m_story(story),
          m_nextId(static_cast<int>(model.credentials().size()) + 1) {}

    void run(int steps) {
        settle();
        for (int i = 0; i < steps; ++i) {
            step();
            settle();
        }
        std::vector<std::string> done = requests(m_story);
        std::erase(done, "disconnect");
        m_story.expect("asked for behind the steps\n" + m_told, joined(done), joined(m_model.requests()));
    }

private:
    // Long enough for every credential on every network, and for the pause behind a change of the radio.
    void settle() {
        m_story.advance(60s);
        m_told += "= " + connectedTo(m_story) + "\n";
        m_model.settle();
    }

    void step() {
        static constexpr std::array<void (Play::*)(), 9> kSteps = {
            &Play::drop,         &Play::changeSession, &Play::toggleRadio,      &Play::moveNetwork,
            &Play::moveNetwork,  &Play::connectByHand, &Play::disconnectByHand, &Play::changeCredential,
            &Play::addCredential};
        (this->*kSteps[m_random() % kSteps.size()])();
    }

    void act(const std::string& deed) {
        m_told += deed + "\n";
        m_story.play({deed});
    }

    void drop() {
        if (m_model.connected().empty()) return;
        m_model.drop();
        act(doing("dropConnection"));
    }

    void changeSession() {
        m_model.changeSession();
        act(doing("sessionChange", R"("eventType":5,"sessionId":1)"));
    }

    void toggleRadio() {
        m_model.toggleRadio();
        act(kRadioOff);
        m_story.advance(1s);
        act(kRadioOn);
    }

    // The first one stays, so that a report is never empty.
    void moveNetwork() {
        const std::size_t count = m_model.networks().size();
        if (count < 2) return;
        const std::size_t moved = 1 + m_random() % (count - 1);
        const bool isVisible = !m_model.networks()[moved].isVisible;
        m_model.setVisible(moved, isVisible);
        act(on(isVisible ? "show" : "hide", static_cast<int>(moved) + 1));
        settle();
        if (chance(m_random, 30)) return;
        m_model.report();
        act(kReport);
    }

    void connectByHand() {
        const auto& networks = m_model.networks();
        const std::string name = networks[m_random() % networks.size()].ssid;
        if (name == m_model.connected()) return;
        m_model.connect(name);
        act(connecting(name));
    }

    void disconnectByHand() {
        const std::string name = m_model.connected();
        if (name.empty()) return;
        m_model.disconnect();
        act(disconnecting(name));
    }

    void changeCredential() {
        if (m_model.credentials().empty()) return;
        StoredCredential changed = m_model.credentials()[m_random() % m_model.credentials().size()];
        changed.autoConnect = chance(m_random, 70);
        if (chance(m_random, 40)) {
            m_model.removeCredential(changed.id);
            act(sending("DELETE_CREDENTIAL", "{\"Id\":" + std::to_string(changed.id) + "}"));
        } else {
            m_model.editCredential(changed.id, changed.autoConnect);
            act(sending("EDIT_CREDENTIAL", credentialData(changed)));
        }
    }

    void addCredential() {
        const StoredCredential added = someCredential(m_random, m_nextId);
        // The table takes one credential of each kind for a realm.
        for (const StoredCredential& held : m_model.credentials())
            if (held.realm == added.realm && held.isTls == added.isTls) return;
        ++m_nextId;
        m_model.addCredential(added);
        act(sending("ADD_CREDENTIAL", credentialData(added)));
    }

    Random m_random;
    ConnectModel& m_model;
    Story& m_story;
    int m_nextId;
    std::string m_told;
};

std::uint64_t numberInEnvironment(const char* name, std::uint64_t otherwise) {
    const char* const text = std::getenv(name);
    return text == nullptr ? otherwise : std::strtoull(text, nullptr, 10);
}

// Any number of others, by hand.
TEST(ConnectModel, ForeseesEveryRequestOfRandomStories) {
    const std::uint64_t first = numberInEnvironment("VEXA_MODEL_FIRST", 0);
    const std::uint64_t count = numberInEnvironment("VEXA_MODEL_SEEDS", 45);
    for (std::uint64_t seed = first; seed < first + count; ++seed) {
        Random random(seed);
        const std::vector<StoredCredential> credentials = someCredentials(random);
        const std::vector<ModelNetwork> networks = someNetworks(random);
        const Ending ending = runStory({.seed = seed}, scenarioOf(credentials, networks), [&](Story& story) {
            ConnectModel model(credentials, networks);
            Play(seed, model, story).run(12);
        });
        ASSERT_EQ(ending.wrong, "");
    }
}

}  // namespace
}  // namespace vexa::test
