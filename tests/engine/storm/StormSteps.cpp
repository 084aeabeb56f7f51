#include "engine/storm/StormSteps.h"

#include <algorithm>
#include <array>
#include <set>
#include <string_view>
#include <utility>

#include "engine/world/ConnectStory.h"

namespace vexa::test {

namespace {

using namespace std::chrono_literals;
using Random = std::mt19937_64;

constexpr std::array<const char*, 8> kNames = {"Airport", "Cafe", "Airport", "Harbour",
                                               "Cafe",    "Air",  "Airport", "Hotel"};
constexpr int kStepsBetweenChecks = 12;
constexpr int kTriesToHeal = 8;
constexpr auto kBeat = 100ms;
constexpr int kBeatsOfPatience = 300000;

// What the machine does beside the networks that come and go. "<a|b>" is one of these, "<#9>" a number below
// nine, "<x99>" the hex of at most so many bytes. What stands here twice happens more often.
constexpr std::array kActions = {
    R"({"do":"fail","call":"WlanIhvControl","match":"<bssList|anqpInfo|anqpQuery>","error":31,"times":<1|2|3>})",
    R"({"do":"fail","call":"<WlanQueryInterface|WlanConnect|WlanDisconnect|rename>","error":5,"times":<1|2|3>})",
    R"({"do":"fail","call":"<WlanOpenHandle|WlanEnumInterfaces|GetAdaptersAddresses>","error":8,"times":<1|2>})",
    R"({"do":"ihv","dataHex":"005ec403<x4>"})",
    R"({"do":"ihv","dataHex":"005ec403000000000<1|2|3|4|5|6|7|8>000000<00|2c|34|68><00|01>0000<x300>"})",
    R"({"do":"ihv","dataHex":"005ec40600000000<01|02>000000325c0000<x600>"})",
    R"({"do":"notify","source":<8|16|32|64>,"code":<#24>,"dataHex":"<x700>"})",
    R"({"do":"reply","match":"<anqpInfo|channelList>","dataHex":"<x60>"})",
    R"({"do":"radio","hardware":"<on|on|off|unknown>","software":"<on|on|off|unknown>"})",
    R"({"do":"pullAdapter"})",
    R"({"do":"insertAdapter"})",
    R"({"do":"insertAdapter"})",
    R"({"do":"reportNetworks"})",
    R"({"do":"reportNetworks"})",
    R"({"do":"completeAnqpQuery"})",
    R"({"do":"reportAnqp","bssid":"02:aa:00:00:00:0<#8>"})",
    R"({"do":"userDisconnect","ssid":"<Airport|Cafe|Harbour|Air|Hotel>"})",
    R"({"do":"sessionChange","eventType":<#11>})",
    R"({"do":"setSession","session":"<disconnected|active|active>"})",
    R"({"do":"driverState","current":<#9>,"previous":<#9>})",
    R"({"do":"osConnect","ssid":"<Airport|Cafe|Harbour|Air|Hotel>","succeeds":<true|false>})",
    R"({"do":"dropConnection"})",
    R"({"do":"connection","code":<#24>,"ssidHex":"416972","profileName":"Air"})",
    R"({"do":"roam"})",
    R"({"do":"setDns","dns":[<|"192.0.2.1">]})",
    R"({"do":"set","connectMs":<#9000>,"anqpMs":<#9000>})",
    R"({"do":"interfaceState","value":<#8>})",
    R"({"do":"interfaceState","value":null})",
    R"({"do":"setNetwork","bssid":"02:aa:00:00:00:0<#8>","anqp":"<ready|ready|onQuery|never>"})",
    R"({"do":"setNetwork","bssid":"02:aa:00:00:00:0<#8>","realms":[{"names":["<a.example|b.example>"],)"
    R"("eapMethods":[13,21]}]})",
    R"({"do":"setNetwork","bssid":"02:aa:00:00:00:0<#8>","realms":[{"names":["a.example;c.example"],)"
    R"("eapMethods":[21]}]})",
    R"({"do":"setNetwork","bssid":"02:aa:00:00:00:0<#8>",)"
    R"("accepts":[<|{"eapMethod":13},{"eapMethod":21}>]})",
};

const std::string kAutoConnect = R"("AutoConnect":<true|true|true|false>)";
const std::string kNetworkName = R"({"NetWorkName":"<Airport|Cafe|Harbour|Air|Hotel>"})";

const std::vector<std::pair<std::string, std::string>> kHotspotCommands = {
    {"UPDATE_NETWORK_REALM", ""},
    {"GET_RADIO", ""},
    {"SET_HOTSPOT_AUTO_CONNECT", "<true|true|false>"},
    {"GET_IS_CARD_IN", ""},
    {"READ_CREDENTIAL_FROM_FILE", ""},
    {"GET_ALL_CREDENTIAL_LIST", ""},
    {"ADD_CREDENTIAL", ttlsData("<a|b>.example", kAutoConnect)},
    {"ADD_CREDENTIAL", tlsData("<a|b>.example", kAutoConnect)},
    {"DELETE_CREDENTIAL", R"({"Id":<#6>})"},
    {"EDIT_CREDENTIAL", ttlsData("<a|b>.example", R"("Id":<#6>,)" + kAutoConnect)},
    {"EDIT_CREDENTIAL", tlsData("<a|b>.example", R"("Id":<#6>,)" + kAutoConnect)},
    {"SET_POSITION_CREDENTIAL", R"({"Id":<#6>,"Order":<#5>})"},
    {"CONNECT_NETWORK", kNetworkName},
    {"DISCONNECT_NETWORK", kNetworkName},
    {"GET_ALL_NETWORK_LIST", ""},
    {"GET_IS_INTERNET_ACCESS", ""},
    {"NONSENSE", "<x9>"},
};

const std::vector<std::string> kSpectralCommands = {"FULL_SCAN", "STOP_SCAN", "GET_CHANNEL_LIST",
                                                    "GET_CURRENT_CHANNEL", "NONSENSE"};

template <class Container>
auto oneOf(Random& random, const Container& container) {
    return container[random() % std::size(container)];
}

std::string chosen(Random& random, std::string_view choices) {
    const std::uint64_t limit = choices.size() < 2 ? 0 : std::strtoull(choices.data() + 1, nullptr, 10);
    if (choices.starts_with('#')) return std::to_string(random() % limit);
    if (choices.starts_with('x')) {
        Block bytes(random() % (limit + 1));
        std::generate(bytes.begin(), bytes.end(), [&] { return static_cast<std::byte>(random() & 0xFF); });
        return hexOf(bytes);
    }
    const auto bars = std::count(choices.begin(), choices.end(), '|');
    for (auto left = random() % static_cast<std::uint64_t>(bars + 1); left > 0; --left)
        choices.remove_prefix(choices.find('|') + 1);
    return std::string(choices.substr(0, choices.find('|')));
}

std::string filled(Random& random, std::string_view pattern) {
    std::string text;
    for (;;) {
        const std::size_t open = pattern.find('<');
        text += pattern.substr(0, open);
        if (open == pattern.npos) return text;
        const std::size_t close = pattern.find('>');
        text += chosen(random, pattern.substr(open + 1, close - open - 1));
        pattern.remove_prefix(close + 1);
    }
}

std::string listed(const std::multiset<std::string>& names) {
    std::string text;
    for (const std::string& name : names)
        text += name + " ";
    return text;
}

}  // namespace

std::string Storm::scenario(double speed) {
    std::vector<std::string> networks;
    for (const char* name : kNames)
        networks.push_back(network(static_cast<int>(networks.size()), name,
                                   both() + "," + lettingIn(R"({"eapMethod":21})")));
    return air(networks, R"("spectrum":{"channels":[1,6,36],"scanMs":3000,"levels":
        {"6":{"congestion":40,"power":60,"spread":9}}},"speed":)" +
                             std::to_string(speed));
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
    if (m_random() % 3 == 0) {
        bss.isReported = !bss.isReported;
        return on("setNetwork", number, R"("reported":)" + std::string(bss.isReported ? "true" : "false"));
    }
    bss.isVisible = m_random() % 2 == 0;
    return on(bss.isVisible ? "show" : "hide", number);
}

void Storm::sendCommands() {
    for (std::uint64_t left = m_random() % 3; left > 0; --left) {
        const auto [command, data] = oneOf(m_random, kHotspotCommands);
        m_world.hotspot().send(command, filled(m_random, data));
    }
    if (m_random() % 2 == 0) return;
    m_world.spectral().send(oneOf(m_random, kSpectralCommands));
}

void Storm::step() {
    m_world.perform(m_random() % 6 == 0 ? changeOfTheAir() : filled(m_random, oneOf(m_random, kActions)));
    sendCommands();
    if (m_random() % 3 == 0) m_pass(std::chrono::milliseconds(m_random() % 15000));
}

// A fault that still waits for its call can stand in the way of each of these, but not for ever.
std::string Storm::check() {
    const std::string expected = namesInRange();
    for (int tries = 0; tries < kTriesToHeal; ++tries) {
        m_world.play({doing("insertAdapter"), doing("radio", R"("hardware":"on","software":"on")")});
        m_world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "true");
        if (!waitForAnswers()) return "no answer to a command\n";
        m_shown = "nothing";
        m_world.perform(kReport);
        hear();
        const std::string told = m_shown;
        m_world.hotspot().send("GET_ALL_NETWORK_LIST");
        if (!waitForAnswers()) return "no answer to a command\n";
        if (expected.empty()) return {};  // a report of nothing is refused, and the list stays
        if (told == expected && m_shown == expected) return {};
    }
    return "in range: " + expected + "; shown: " + m_shown + "\n";
}

// Takes in what the clients got. True if an answer about the card was among it.
bool Storm::hear() {
    bool isAnswered = false;
    m_world.spectral().events();
    for (const ClientEvent& event : m_world.hotspot().events()) {
        isAnswered |= event.id.starts_with("CARD_PLUG") && event.hasData;
        if (event.id != "GET_ALL_NETWORK_LIST") continue;
        std::multiset<std::string> names;
        for (const Json::Value& entry : event.data)
            names.insert(entry["NetWorkName"].asString());
        m_shown = listed(names);
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
    return listed({names.begin(), names.end()});
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
