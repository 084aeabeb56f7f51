#include <gtest/gtest.h>

#include "engine/AirStory.h"
#include "engine/StoreStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kReport = R"({"do":"reportNetworks"})";
constexpr const char* kTimeOut = "Timeout happens in the network connecting thread.";
constexpr const char* kListChanged = "HS20 network list changed event signaled.";
constexpr const char* kAnqpReady = "ANQP info ready event signaled.";

constexpr const char* kAsleep = "Current session is not active, sleep for a while and continue.";
constexpr const char* kNoNetwork = "No HS20 BSS, wait for HS20 network list change.";
constexpr const char* kNoCredential = "No credential, wait for user to add credential.";

std::string fetched(int number, const std::string& ssid) {
    return network(number, ssid, realms("a.example", "21"));
}

// What the log tells of the rounds while this time passes.
std::string roundsIn(World& world, platform::Duration span) {
    const std::size_t before = world.logSize();
    world.advance(span);
    return roundsSince(world, before);
}

std::string round(const std::string& wake, const std::string& gate) {
    return wake + " | " + gate + "\n";
}

// A stored credential that fits no network here.
void addCredential(World& world) {
    world.hotspot().send("ADD_CREDENTIAL", ttlsData("elsewhere.example"));
    world.advance(0ms);
}

// One that fits the networks here.
std::string autoConnectData() {
    std::string data = ttlsData("a.example");
    return data.insert(data.find('{') + 1, R"("AutoConnect":true,)");
}

/// A world with one network and a credential, unless it says otherwise.
struct Gate {
    const char* what;
    std::string action;
    std::string line;
    std::string scenario = air({fetched(1, "A")});
    bool hasCredential = true;
};

Gate notDisconnected(const char* what, int interfaceState, const std::string& name) {
    return {
        what, R"({"do":"interfaceState","value":)" + std::to_string(interfaceState) + "}",
        "Supplicant not in disconnected state, skip this round of network connecting. | Queried supplicant "
        "state=" +
            name};
}

const std::vector<Gate>& gates() {
    static const std::vector<Gate> all = {
        {"radio off", R"({"do":"radio","software":"off"})", "Radio turned off, wait it be turned on."},
        {"hardware radio off is none of its business", R"({"do":"radio","hardware":"off"})", kNoNetwork,
         air({})},
        notDisconnected("not ready", 0, "InvalidState"),
        notDisconnected("connected", 1, "Connected"),
        notDisconnected("ad hoc", 2, "InvalidState"),
        notDisconnected("disconnecting", 3, "Disconnecting"),
        notDisconnected("associating", 5, "Associating"),
        notDisconnected("discovering", 6, "Scanning"),
        notDisconnected("authenticating", 7, "Authenticating"),
        {"a query that fails", R"({"do":"fail","call":"WlanQueryInterface","error":31,"times":1000})",
         "WlanQueryInterface failed in Supplicant::queryState. | " +
             notDisconnected("", 0, "InvalidState").line},
        {"no network", "", kNoNetwork, "{}"},
        {"no credential", "", kNoCredential, air({fetched(1, "A")}), false},
        {"no credential, and a network without data", "", kNoCredential, air({network(1, "A")}), false},
        {"no session", R"({"do":"setSession","session":"disconnected"})", kAsleep},
    };
    return all;
}

TEST(ConnectingThread, TellsInEachRoundWhichGateHeldIt) {
    for (const Gate& gate : gates()) {
        const Ending ending = runStory(1, gate.scenario, [&](World& world) {
            if (gate.hasCredential) addCredential(world);
            settle(world);
            if (!gate.action.empty()) world.perform(gate.action);
            world.advance(40s);
            return roundsIn(world, 10s);
        });
        EXPECT_TRUE(ending.isOrderly) << gate.what << ending.errors;
        // A round that sleeps is not over when ten seconds are.
        if (gate.line == kAsleep)
            EXPECT_TRUE(ending.text.ends_with(kAsleep)) << ending.text;
        else
            EXPECT_EQ(ending.text, round(kTimeOut, gate.line)) << gate.what;
    }
}

TEST(ConnectingThread, WithTheFunctionOffNoRoundAsksTheAdapterAnything) {
    const Ending ending = runStory(2, air({network(1, "A")}), [](World& world) {
        settle(world);
        world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "false");
        world.advance(0ms);
        world.perform(R"({"do":"radio","software":"off"})");
        world.advance(40s);
        world.perform(R"({"do":"clearCalls"})");
        std::string rounds = roundsIn(world, 30s);
        return rounds + std::to_string(world.perform(R"({"query":"calls","all":true})").size());
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    const std::string off = round(kTimeOut, "HS20 functionality not enabled, wait for user turning it on.");
    EXPECT_EQ(ending.text, off + off + off + "0");
}

TEST(ConnectingThread, RunsARoundEveryTenSecondsWhenNothingHappens) {
    const Ending ending = runStory(3, "{}", [](World& world) {
        settle(world);
        return roundsIn(world, 60s);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    std::string expected;
    for (int i = 0; i < 6; ++i)
        expected += round(kTimeOut, kNoNetwork);
    EXPECT_EQ(ending.text, expected);
}

TEST(ConnectingThread, AnUpdateWakesItTwiceOnceForTheListAndOnceForTheData) {
    const Ending ending = runStory(4, air({fetched(1, "A")}), [](World& world) {
        settle(world);
        const std::size_t before = world.logSize();
        world.perform(kReport);
        world.advance(0ms);
        const std::string lines = messagesSince(world, before);
        return count(lines, kListChanged) + count(lines, kAnqpReady) + count(lines, kNoCredential) +
               (lines.find(kListChanged) < lines.find(kAnqpReady) ? "in order" : "out of order");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1 1 2 in order");
}

// All of them are signalled while the thread sleeps after a radio event, which has the last place.
TEST(ConnectingThread, TakesTheEventsThatWaitInTheirOrder) {
    for (std::uint64_t seed = 100; seed < 130; ++seed) {
        const Ending ending = runStory(seed, air({fetched(1, "A")}), [](World& world) {
            settle(world);
            world.perform(R"({"do":"radio","software":"off"})");
            world.advance(1s);
            const std::size_t before = world.logSize();
            world.perform(R"({"do":"radio","software":"on"})");
            addCredential(world);
            world.perform(kReport);
            world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "false");
            world.advance(0ms);
            world.advance(9s);
            std::string wakes;
            const std::string lines = messagesSince(world, before);
            std::istringstream stream(lines);
            for (std::string line; std::getline(stream, line);)
                if (line.find(" signaled.") != std::string::npos)
                    wakes += line.substr(0, line.find(' ')) + " ";
            return wakes;
        });
        EXPECT_TRUE(ending.isOrderly) << "seed " << seed << ending.errors;
        EXPECT_EQ(ending.text, "Enable/disable HS20 Credential ANQP Supplicant Radio ") << "seed " << seed;
    }
}

TEST(ConnectingThread, SleepsTenSecondsAfterARadioEventBeforeItsGates) {
    const Ending ending = runStory(5, "{}", [](World& world) {
        settle(world);
        world.perform(R"({"do":"radio","software":"off"})");
        const std::size_t before = world.logSize();
        world.advance(9999ms);
        std::string text = roundsSince(world, before) + "---";
        world.advance(1ms);
        return text + roundsSince(world, before).substr(text.size() - 3);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_TRUE(ending.text.starts_with("---Radio turned off, wait it be turned on.\n")) << ending.text;
}

TEST(ConnectingThread, AsksForMissingDataFirstAndWaitsForTheEndOfTheQuery) {
    const Ending ending =
        runStory(6, air({network(1, "A", R"("anqp":"never")"), fetched(2, "B")}, R"("anqpMs":3000)"),
                 [](World& world) {
                     addCredential(world);
                     settle(world);
                     world.advance(20s);
                     world.perform(R"({"do":"clearCalls"})");
                     const std::string text = roundsIn(world, 13s);
                     return text + std::to_string(moduleRequests(world, 3));
                 });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    const std::string asks =
        "Not all HS20 network ANQP info fetched, we will query the ANQP info first before auto connecting. | "
        "SIGMA: Enter Supplicant::queryHs20NetworkAnqpInfo. | Supplicant::queryHs20NetworkAnqpInfo "
        "completed.";
    EXPECT_NE(ending.text.find(asks), std::string::npos) << ending.text;
    EXPECT_NE(ending.text.find("ANQP querying finished."), std::string::npos) << ending.text;
    EXPECT_EQ(ending.text.find("connectNetwork"), std::string::npos)
        << "one network without data stops them all";
}

TEST(ConnectingThread, AQueryThatWasRefusedIsAskedAgainInTheNextRound) {
    const Ending ending = runStory(7, air({network(1, "A", R"("anqp":"never")")}), [](World& world) {
        settle(world);
        world.perform(R"({"do":"fail","call":"WlanIhvControl","error":31,"match":"anqpQuery","times":2})");
        addCredential(world);
        return messagesSince(world, 0);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_NE(ending.text.find("WlanIhvControl call failed in sendIhvCmd with result code=31\n"),
              std::string::npos);
    EXPECT_EQ(ending.text.find("We are querying the HS20 network ANQP info, wait."), std::string::npos);
}

TEST(ConnectingThread, AnEndOfTheQueryThatBringsNoListLeavesTheQueryRunning) {
    const Ending ending =
        runStory(8, air({network(1, "A", R"("anqp":"never")")}, R"("anqpMs":3000)"), [](World& world) {
            settle(world);
            world.perform(R"({"do":"fail","call":"WlanIhvControl","error":31,"match":"bssList","times":1})");
            addCredential(world);
            world.advance(5s);
            const std::string held = roundsIn(world, 20s);
            world.perform(R"({"do":"completeAnqpQuery"})");
            return held + messagesSince(world, 0);
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    const std::string waits = round(kTimeOut, "We are querying the HS20 network ANQP info, wait.");
    EXPECT_TRUE(ending.text.starts_with(waits + waits)) << ending.text.substr(0, 400);
    EXPECT_NE(ending.text.find("ANQP querying finished."), std::string::npos);
}

TEST(ConnectingThread, ARoundInADisconnectedSessionLastsFiveSecondsMore) {
    const Ending ending =
        runStory(9, air({fetched(1, "A")}, R"("session":"disconnected")"), [](World& world) {
            addCredential(world);
            settle(world);
            world.advance(40s);
            const std::string rounds = roundsIn(world, 60s);
            return count(rounds, kAsleep) + count(rounds, "connectNetwork");
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "4 0 ");
}

TEST(ConnectingThread, WithEveryGateOpenItFindsNothingToDoAndSaysSo) {
    const Ending ending = runStory(10, air({fetched(1, "A")}), [](World& world) {
        addCredential(world);
        settle(world);
        world.advance(20s);
        return roundsIn(world, 10s);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_TRUE(ending.text.starts_with(kTimeOut)) << ending.text;
    EXPECT_TRUE(ending.text.ends_with("connectNetwork returns with op cancelled.\n")) << ending.text;
}

TEST(ConnectingThread, WaitsForTheResultOfAnAttemptThatIsUnderWay) {
    const Ending ending = runStory(20, air({fetched(1, "A")}, R"("connectMs":100000)"), [](World& world) {
        world.hotspot().send("ADD_CREDENTIAL", autoConnectData());
        settle(world);
        world.perform(R"({"do":"interfaceState","value":4})");
        world.advance(20s);
        return roundsIn(world, 10s);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              round(kTimeOut,
                    "Connection already started, wait for connection operation completed event signaled."));
}

int connectRequests(World& world) {
    int requests = 0;
    for (const Json::Value& call : world.perform(R"({"query":"calls"})"))
        if (call["call"].asString() == "WlanConnect") ++requests;
    return requests;
}

TEST(ConnectingThread, ConnectsToNobodyUntilTheLastNetworkHasAnswered) {
    const Ending ending =
        runStory(21, air({network(1, "Mute", R"("anqp":"never")"), fetched(2, "A")}, R"("connectMs":100000)"),
                 [](World& world) {
                     world.hotspot().send("ADD_CREDENTIAL", autoConnectData());
                     world.advance(100s);
                     std::string requests = std::to_string(connectRequests(world));
                     world.perform(on("setNetwork", 1, R"("anqp":"ready",)" + realms("m.example", "13")));
                     world.perform(kReport);
                     world.advance(30s);
                     return requests + " " + std::to_string(connectRequests(world));
                 });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "0 1");
}

}  // namespace
}  // namespace vexa::test
