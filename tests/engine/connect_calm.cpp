#include "engine/connect_calm.h"

#include <array>
#include <random>

#include "engine/StoreStory.h"
#include "engine/StormSteps.h"
#include "engine/connect_story.h"

namespace vexa::test {

namespace {

using namespace std::chrono_literals;

constexpr int kNetworksOfTheStorm = 8;
constexpr int kHavenNumber = 99;
constexpr int kStepsOfAPart = 24;
constexpr int kTriesToHeal = 5;
constexpr auto kPatience = 60s;

std::string credentialFor(const std::string& realm, bool isTls) {
    Json::Value data = parsed(isTls ? tlsData(realm) : ttlsData(realm));
    data["AutoConnect"] = true;
    data["AccessType"] = 1;
    return data.toStyledString();
}

// An adapter whose start failed twice stays as it is until it has been pulled.
void heal(World& world) {
    static constexpr std::array<const char*, 8> kActions = {
        R"({"do":"pullAdapter"})",
        R"({"do":"insertAdapter"})",
        R"({"do":"radio","hardware":"on","software":"on"})",
        R"({"do":"interfaceState","value":null})",
        R"({"do":"setSession","session":"active"})",
        R"({"do":"set","connectMs":200,"anqpMs":200})",
        R"({"do":"completeAnqpQuery"})",
        R"({"do":"sessionChange","eventType":5,"sessionId":1})"};
    for (const char* action : kActions)
        world.perform(action);
    for (int number = 0; number < kNetworksOfTheStorm; ++number)
        world.perform(on("setNetwork", number, R"("anqp":"ready",)" + realms("a.example", "13,21")));
    switchHs20(world, true);
    world.perform(R"({"do":"reportNetworks"})");
    world.hotspot().send("ADD_CREDENTIAL", credentialFor("haven.example", false));
    world.advance(0ms);
}

// Faults that wait for their call take these requests instead of the last ones.
void useUpFaults(World& world) {
    for (int tries = 0; tries < kTriesToHeal; ++tries) {
        heal(world);
        connect(world, "Haven");
        world.perform(R"({"do":"dropConnection"})");
        world.advance(15s);
    }
    heal(world);
}

// Gives the log if nothing is connected after a minute.
std::string joinsWhenLeftAlone(World& world) {
    world.perform(on("show", kHavenNumber));
    useUpFaults(world);
    const std::size_t before = world.logSize();
    world.perform(R"({"do":"dropConnection"})");
    std::string missing;
    platform::Duration passed{};
    for (; passed < kPatience && connectedTo(world) == "-"; passed += 1s)
        world.advance(1s);
    if (connectedTo(world) == "-") missing = "not connected:\n" + messagesSince(world, before);
    world.perform(on("hide", kHavenNumber));
    return missing;
}

}  // namespace

std::string stormOfConnections(World& world, std::uint64_t seed, int steps) {
    Storm storm(world, seed);
    std::mt19937_64 random(seed);
    world.perform(
        R"({"do":"addNetwork","network":)" +
        network(kHavenNumber, "Haven", ttls("haven.example") + "," + lettingInAll() + R"(,"visible":false)") +
        "}");
    for (int step = 0; step < steps; step += kStepsOfAPart) {
        for (const bool isTls : {false, true})
            world.hotspot().send("ADD_CREDENTIAL",
                                 credentialFor(random() % 2 == 0 ? "a.example" : "b.example", isTls));
        for (int i = 0; i < kStepsOfAPart; ++i)
            storm.step();
        if (const std::string wrong = joinsWhenLeftAlone(world); !wrong.empty())
            return "before step " + std::to_string(step + kStepsOfAPart) + " " + wrong;
    }
    return {};
}

}  // namespace vexa::test
