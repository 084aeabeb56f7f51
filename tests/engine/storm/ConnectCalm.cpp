#include <random>

#include "engine/storm/StormSteps.h"
#include "engine/world/ConnectStory.h"

namespace vexa::test {

namespace {

using namespace std::chrono_literals;

constexpr int kNetworksOfTheStorm = 8;
constexpr int kHavenNumber = 99;
constexpr int kStepsOfAPart = 24;
constexpr int kTriesToHeal = 5;
constexpr auto kPatience = 60s;

constexpr const char* kAutoConnect = R"("AutoConnect":true,"AccessType":1)";

// An adapter whose start failed twice stays as it is until it has been pulled.
void heal(World& world) {
    world.play({doing("pullAdapter"), doing("insertAdapter"),
                doing("radio", R"("hardware":"on","software":"on")"),
                doing("interfaceState", R"("value":null)"), doing("setSession", R"("session":"active")"),
                doing("set", R"("connectMs":200,"anqpMs":200)"), doing("completeAnqpQuery"),
                doing("sessionChange", R"("eventType":5,"sessionId":1)")});
    for (int number = 0; number < kNetworksOfTheStorm; ++number)
        world.perform(on("setNetwork", number, R"("anqp":"ready",)" + both()));
    world.play({kHs20On, kReport, sending("ADD_CREDENTIAL", ttlsData("haven.example", kAutoConnect))});
}

// Faults that wait for their call take these requests instead of the last ones.
void useUpFaults(World& world) {
    for (int tries = 0; tries < kTriesToHeal; ++tries) {
        heal(world);
        world.play({connecting("Haven"), doing("dropConnection"), passing(15s)});
    }
    heal(world);
}

// Gives the log if nothing is connected after a minute.
std::string joinsWhenLeftAlone(World& world) {
    world.perform(on("show", kHavenNumber));
    useUpFaults(world);
    world.forget();
    world.act("dropConnection");
    std::string missing;
    platform::Duration passed{};
    for (; passed < kPatience && connectedTo(world) == "-"; passed += 1s)
        world.advance(1s);
    if (connectedTo(world) == "-") missing = "not connected:\n" + world.messages();
    world.perform(on("hide", kHavenNumber));
    return missing;
}

}  // namespace

std::string stormOfConnections(World& world, std::uint64_t seed, int steps) {
    Storm storm(world, seed);
    std::mt19937_64 random(seed);
    const std::string haven = open(kHavenNumber, "Haven", ttls("haven.example") + R"(,"visible":false)");
    world.perform(adding(haven));
    for (int step = 0; step < steps; step += kStepsOfAPart) {
        for (const auto& dataFor : {ttlsData, tlsData})
            world.hotspot().send("ADD_CREDENTIAL",
                                 dataFor(random() % 2 == 0 ? "a.example" : "b.example", kAutoConnect));
        for (int i = 0; i < kStepsOfAPart; ++i)
            storm.step();
        if (const std::string wrong = joinsWhenLeftAlone(world); !wrong.empty())
            return "before step " + std::to_string(step + kStepsOfAPart) + " " + wrong;
    }
    return {};
}

}  // namespace vexa::test
