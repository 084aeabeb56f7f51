#include "engine/StormSteps.h"

#include <array>
#include <set>
#include <string_view>
#include <utility>

#include "engine/AirStory.h"
#include "engine/StoreStory.h"

namespace vexa::test {

namespace {

using namespace std::chrono_literals;
using Random = std::mt19937_64;

constexpr std::array<const char*, 8> kNames = {"Airport", "Cafe", "Airport", "Harbour",
                                               "Cafe",    "Air",  "Airport", "Hotel"};
constexpr std::array<const char*, 3> kRealms = {"a.example", "b.example", "a.example;c.example"};
constexpr int kStepsBetweenChecks = 12;
constexpr int kTriesToHeal = 8;
constexpr auto kBeat = 100ms;
constexpr int kBeatsOfPatience = 300000;

template <class Container>
auto oneOf(Random& random, const Container& container) {
    return container[random() % std::size(container)];
}

std::string numberBelow(Random& random, std::uint64_t limit) {
    return std::to_string(random() % limit);
}

Block randomBytes(Random& random, std::size_t most) {
    Block bytes(random() % (most + 1));
    for (std::byte& byte : bytes)
        byte = static_cast<std::byte>(random() & 0xFF);
    return bytes;
}

std::string doing(const std::string& name, const std::string& members = "") {
    return R"({"do":")" + name + "\"" + (members.empty() ? "" : "," + members) + "}";
}

std::string onOff(Random& random) {
    static constexpr std::array<const char*, 4> kStates = {"on", "off", "on", "unknown"};
    return oneOf(random, kStates);
}

std::string randomFault(Random& random) {
    static constexpr std::array<const char*, 9> kCalls = {R"("call":"WlanIhvControl","match":"bssList")",
                                                          R"("call":"WlanIhvControl","match":"anqpInfo")",
                                                          R"("call":"WlanIhvControl","match":"anqpQuery")",
                                                          R"("call":"WlanQueryInterface")",
                                                          R"("call":"WlanConnect")",
                                                          R"("call":"WlanDisconnect")",
                                                          R"("call":"WlanOpenHandle")",
                                                          R"("call":"GetAdaptersAddresses")",
                                                          R"("call":"rename")"};
    return doing("fail", oneOf(random, kCalls) + std::string(R"(,"error":)") +
                             std::to_string(1 + random() % 200) + R"(,"times":)" +
                             std::to_string(1 + random() % 3));
}

std::string randomModuleMessage(Random& random) {
    return moduleMessage(1 + static_cast<unsigned>(random() % 8), randomBytes(random, 300),
                         static_cast<unsigned>(random() % 400));
}

std::string randomNotification(Random& random) {
    return doing("notify", R"("source":)" + std::to_string(8U << random() % 3) + R"(,"code":)" +
                               numberBelow(random, 24) + R"(,"dataHex":")" + hexOf(randomBytes(random, 700)) +
                               "\"");
}

std::string randomReply(Random& random) {
    return doing("reply", R"("match":"anqpInfo","dataHex":")" + hexOf(randomBytes(random, 60)) + "\"");
}

using Make = std::string (*)(Random& random);

/// What the machine does beside the networks that come and go.
constexpr std::array<Make, 24> kActions = {
    randomFault,
    randomFault,
    randomModuleMessage,
    randomNotification,
    randomReply,
    [](Random& random) {
        return doing("radio", R"("hardware":")" + onOff(random) + R"(","software":")" + onOff(random) + "\"");
    },
    [](Random&) { return doing("pullAdapter"); },
    [](Random&) { return doing("insertAdapter"); },
    [](Random&) { return doing("insertAdapter"); },
    [](Random&) { return doing("reportNetworks"); },
    [](Random&) { return doing("reportNetworks"); },
    [](Random&) { return doing("completeAnqpQuery"); },
    [](Random& random) { return on("reportAnqp", static_cast<int>(random() % kNames.size())); },
    [](Random& random) {
        return doing("userDisconnect", R"("ssid":")" + std::string(oneOf(random, kNames)) + "\"");
    },
    [](Random& random) { return doing("sessionChange", R"("eventType":)" + numberBelow(random, 11)); },
    [](Random& random) {
        return doing("setSession",
                     random() % 3 == 0 ? R"("session":"disconnected")" : R"("session":"active")");
    },
    [](Random& random) {
        return doing("driverState",
                     R"("current":)" + numberBelow(random, 9) + R"(,"previous":)" + numberBelow(random, 9));
    },
    [](Random& random) {
        return doing("osConnect", R"("ssid":")" + std::string(oneOf(random, kNames)) + R"(","succeeds":)" +
                                      (random() % 2 == 0 ? "true" : "false"));
    },
    [](Random&) { return doing("dropConnection"); },
    [](Random& random) {
        return doing("connection",
                     R"("code":)" + numberBelow(random, 24) + R"(,"ssidHex":"416972","profileName":"Air")");
    },
    [](Random&) { return doing("roam"); },
    [](Random& random) {
        return doing("setDns", random() % 2 == 0 ? R"("dns":[])" : R"("dns":["192.0.2.1"])");
    },
    [](Random& random) {
        return doing("set", R"("connectMs":)" + numberBelow(random, 9000) + R"(,"anqpMs":)" +
                                numberBelow(random, 9000));
    },
    [](Random& random) {
        return doing("interfaceState", R"("value":)" + (random() % 2 == 0 ? "null" : numberBelow(random, 8)));
    },
};

std::string withMember(std::string data, const std::string& member) {
    data.insert(data.find('{') + 1, member + ",");
    return data;
}

std::string credential(Random& random) {
    const std::string realm = std::string(oneOf(random, kRealms)).substr(0, 9);
    return withMember(random() % 2 == 0 ? ttlsData(realm) : tlsData(realm),
                      std::string(R"("AutoConnect":)") + (random() % 4 == 0 ? "false" : "true"));
}

std::string withId(Random& random, const std::string& data) {
    return withMember(data, "\"Id\":" + numberBelow(random, 6));
}

std::string networkName(Random& random) {
    return R"({"NetWorkName":")" + std::string(oneOf(random, kNames)) + "\"}";
}

struct Command {
    const char* id;
    Make data;
};

std::string noData(Random&) {
    return {};
}

constexpr std::array<Command, 15> kCommands = {{
    {"UPDATE_NETWORK_REALM", noData},
    {"GET_RADIO", noData},
    {"SET_HOTSPOT_AUTO_CONNECT",
     [](Random& random) { return std::string(random() % 3 == 0 ? "false" : "true"); }},
    {"GET_IS_CARD_IN", noData},
    {"READ_CREDENTIAL_FROM_FILE", noData},
    {"GET_ALL_CREDENTIAL_LIST", noData},
    {"ADD_CREDENTIAL", credential},
    {"DELETE_CREDENTIAL", [](Random& random) { return R"({"Id":)" + numberBelow(random, 6) + "}"; }},
    {"EDIT_CREDENTIAL", [](Random& random) { return withId(random, credential(random)); }},
    {"SET_POSITION_CREDENTIAL",
     [](Random& random) {
         return R"({"Id":)" + numberBelow(random, 6) + R"(,"Order":)" + numberBelow(random, 5) + "}";
     }},
    {"CONNECT_NETWORK", networkName},
    {"DISCONNECT_NETWORK", networkName},
    {"GET_ALL_NETWORK_LIST", noData},
    {"GET_IS_INTERNET_ACCESS", noData},
    {"NONSENSE", [](Random& random) { return hexOf(randomBytes(random, 9)); }},
}};

std::string joined(const std::multiset<std::string>& names) {
    std::string text;
    for (const std::string& name : names)
        text += name + " ";
    return text;
}

std::string realmMember(Random& random) {
    return realms(oneOf(random, kRealms), random() % 2 == 0 ? "13,21" : "21");
}

std::string accepts(Random& random) {
    return random() % 2 == 0 ? R"("accepts":[])" : R"("accepts":[{"eapMethod":13},{"eapMethod":21}])";
}

}  // namespace

std::string Storm::scenario(double speed) {
    std::vector<std::string> networks;
    for (const char* name : kNames)
        networks.push_back(network(static_cast<int>(networks.size()), name,
                                   realms("a.example", "13,21") + R"(,"accepts":[{"eapMethod":21}])"));
    return air(networks, R"("speed":)" + std::to_string(speed));
}

Storm::Storm(World& world, std::uint64_t seed, Pass pass)
    : m_world(world),
      m_random(seed),
      m_pass(pass ? std::move(pass) : [&world](platform::Duration span) { world.advance(span); }) {
    for (const char* name : kNames)
        m_air.push_back({name});
}

std::string Storm::changeOfTheAir() {
    const auto number = static_cast<int>(m_random() % m_air.size());
    Bss& bss = m_air[static_cast<std::size_t>(number)];
    switch (m_random() % 6) {
        case 0:
            bss.isVisible = false;
            return on("hide", number);
        case 1:
            bss.isVisible = true;
            return on("show", number);
        case 2:
            bss.isReported = !bss.isReported;
            return on("setNetwork", number,
                      R"("reported":)" + std::string(bss.isReported ? "true" : "false"));
        case 3:
            return on("setNetwork", number, realmMember(m_random));
        case 4: {
            static constexpr std::array<const char*, 4> kAnswers = {"ready", "ready", "onQuery", "never"};
            return on("setNetwork", number, R"("anqp":")" + std::string(oneOf(m_random, kAnswers)) + "\"");
        }
        default:
            return on("setNetwork", number, accepts(m_random));
    }
}

std::string Storm::action() {
    return chance(3) ? changeOfTheAir() : oneOf(m_random, kActions)(m_random);
}

void Storm::sendCommands() {
    for (std::uint64_t left = m_random() % 3; left > 0; --left) {
        const Command& command = kCommands[m_random() % kCommands.size()];
        m_world.hotspot().send(command.id, command.data(m_random));
    }
}

void Storm::step() {
    m_world.perform(action());
    sendCommands();
    if (chance(3)) m_pass(std::chrono::milliseconds(m_random() % 15000));
}

// A fault that still waits for its call can stand in the way of each of these, but not for ever.
std::string Storm::check() {
    const std::string expected = namesInRange();
    for (int tries = 0; tries < kTriesToHeal; ++tries) {
        for (const char* heal :
             {R"({"do":"insertAdapter"})", R"({"do":"radio","hardware":"on","software":"on"})"})
            m_world.perform(heal);
        m_world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "true");
        if (!waitForAnswers()) return "no answer to a command\n";
        m_shown = "nothing";
        m_world.perform(R"({"do":"reportNetworks"})");
        hear();
        const std::string told = m_shown;
        m_world.hotspot().send("GET_ALL_NETWORK_LIST");
        if (!waitForAnswers()) return "no answer to a command\n";
        if (expected.empty()) return {};  // a report of nothing is refused, and the list stays
        if (told == expected && m_shown == expected) return {};
    }
    return "in range: " + expected + "; shown: " + m_shown + "\n";
}

// Takes in what the client got. True if an answer about the card was among it.
bool Storm::hear() {
    bool isAnswered = false;
    for (const ClientEvent& event : m_world.hotspot().events()) {
        isAnswered |= event.id.starts_with("CARD_PLUG") && event.hasData;
        if (event.id != "GET_ALL_NETWORK_LIST") continue;
        std::multiset<std::string> names;
        for (const Json::Value& entry : event.data)
            names.insert(entry["NetWorkName"].asString());
        m_shown = joined(names);
    }
    return isAnswered;
}

// Commands are answered in their order, and the one about the card always.
bool Storm::waitForAnswers() {
    hear();
    m_world.hotspot().send("GET_IS_CARD_IN");
    for (int beats = 0; beats < kBeatsOfPatience; ++beats) {
        m_pass(kBeat);
        if (hear()) return true;
    }
    return false;
}

// One entry for each name, however many BSSs share it.
std::string Storm::namesInRange() const {
    std::set<std::string> names;
    for (const Bss& bss : m_air)
        if (bss.isVisible && bss.isReported) names.insert(bss.name);
    return joined({names.begin(), names.end()});
}

std::string storm(World& world, std::uint64_t seed, int steps, Storm::Pass pass) {
    Storm storm(world, seed, std::move(pass));
    for (int step = 1; step <= steps; ++step) {
        storm.step();
        if (step % kStepsBetweenChecks != 0 && step != steps) continue;
        if (const std::string wrong = storm.check(); !wrong.empty())
            return "step " + std::to_string(step) + ", " + wrong;
    }
    return {};
}

}  // namespace vexa::test
