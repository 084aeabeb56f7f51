#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr auto kBehindStart = 15s;

/// With the log off no thread stops at its first line until a handler has ended.
void underManySeeds(const std::string& scenario, const Tale& tale, int seeds = 600) {
    EXPECT_STORY({.seeds = seeds}, scenario, tale);
}

int milliseconds(Story& story) {
    return story.perform(R"({"query":"time"})")["ms"].asInt();
}

/// When the first such request was made, since the machine's start; -1: never.
int firstAt(Story& story, const std::string& call) {
    for (const Json::Value& one : story.perform(R"({"query":"calls"})"))
        if (one["call"].asString() == call) return one["atMs"].asInt();
    return -1;
}

/// Requests to connect, to disconnect and for ANQP queries, one after the other.
std::string order(Story& story) {
    std::string order;
    for (const Json::Value& one : story.perform(R"({"query":"calls"})")) {
        if (one["call"].asString() != "WlanIhvControl") order += one["call"].asString() + " ";
        if (one["inHex"].asString().find("0300000000000000") != std::string::npos) order += "query ";
    }
    return order;
}

TEST(Races, ANetworkIsJoinedAsSoonAsItsRealmsAreKnown) {
    const std::string scenario = air({open(1, "cafe", ttls() + R"(,"anqp":"onQuery","visible":false)")},
                                     storing({{}}) + R"(,"anqpMs":1000)");
    underManySeeds(scenario, [](Story& story) {
        story.advance(kBehindStart);
        story.play({on("show", 1), kReport});
        const int reported = milliseconds(story);
        story.advance(5s);
        story.expect("ms to the request", firstAt(story, "WlanConnect") - reported, 1000);
    });
}

// The query goes before the connecting thread has seen that nothing is connected any more.
TEST(Races, ARealmUpdateGoesBeforeTheNextConnection) {
    underManySeeds(air({kCafe}, storing({{}})), [](Story& story) {
        story.advance(kBehindStart);
        story.expect("connected", connectedTo(story), "cafe");
        story.act("clearCalls");
        story.order("UPDATE_NETWORK_REALM");
        const int left = firstAt(story, "WlanDisconnect");
        story.advance(5s);
        story.expect("requests", order(story), "WlanDisconnect query WlanConnect ");
        story.expect("ms to the next connection", firstAt(story, "WlanConnect") - left, 200);
        story.expect("connected again", connectedTo(story), "cafe");
    });
}

// The connecting thread wakes while the switch is read anew.
TEST(Races, AReloadWithTheSwitchOffConnectsNothing) {
    const std::string scenario = air({open(1, "cafe", ttls() + R"(,"visible":false)")}, storing({{}}));
    underManySeeds(
        scenario,
        [](Story& story) {
            story.act("setRegistry", R"("value":"false")");
            story.order("READ_CREDENTIAL_FROM_FILE");
            story.perform(on("show", 1));
            story.advance(kBehindStart);
            for (int i = 0; i < 10; ++i) {
                story.perform(kReport);
                story.order("READ_CREDENTIAL_FROM_FILE");
            }
            story.advance(kBehindStart);
            story.expect("first request", firstAt(story, "WlanConnect"), -1);
        },
        120);
}

// The connecting thread has passed its gates when the machine's turn begins: that costs nobody an attempt.
TEST(Races, TheMachinesTurnTakesNoAttemptFromTheNextCredential) {
    const std::string cafe = network(1, "cafe", both() + R"(,"visible":false)");
    underManySeeds(air({cafe}, storing({{.isTls = true}, {.id = 2}})), [](Story& story) {
        story.play({passing(kBehindStart), on("show", 1), kReport, passing(60s)});
        expectStanding(story, {.requests = "cafe tls ca1 machineOrUser; cafe tls ca1 machine; cafe ttls u2; "
                                           "cafe ttls u2"});
    });
}

TEST(Races, AStopEndsTheScanWhenever) {
    const std::string scenario = R"({"spectrum":{"channels":[1],"scanMs":1,"levels":{"1":{"power":9}}}})";
    underManySeeds(scenario, [](Story& story) {
        for (int i = 0; i < 20; ++i) {
            story.spectral().send("FULL_SCAN");
            platform::sleepFor(1ms);  // the stop comes with the completion
            story.spectral().send("STOP_SCAN");
            story.advance(100ms);
            story.act("clearCalls");
            story.advance(1s);
            story.expect("requests behind the stop", story.perform(R"({"query":"calls"})").size(), 0);
        }
    });
}

}  // namespace
}  // namespace vexa::test
