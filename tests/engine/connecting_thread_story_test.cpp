#include <gtest/gtest.h>

#include <sstream>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kTimeOut = "Timeout happens in the network connecting thread.";
constexpr const char* kListChanged = "HS20 network list changed event signaled.";
constexpr const char* kAnqpReady = "ANQP info ready event signaled.";

constexpr const char* kAsleep = "Current session is not active, sleep for a while and continue.";
constexpr const char* kNoNetwork = "No HS20 BSS, wait for HS20 network list change.";
constexpr const char* kNoCredential = "No credential, wait for user to add credential.";
constexpr const char* kQuerying = "We are querying the HS20 network ANQP info, wait.";
constexpr const char* kEnds = "The NetworkingMgr thread is to be terminated...";

const std::string kNetwork = network(1, "A", ttls());
const std::string kMute = network(1, "Mute", R"("anqp":"never")");
const std::string kAway = R"("session":"disconnected")";

// What the log tells of the rounds while this time passes.
std::string roundsIn(World& world, platform::Duration span) {
    world.forget();
    world.advance(span);
    return rounds(world);
}

std::string round(const std::string& gate) {
    return std::string(kTimeOut) + " | " + gate + "\n";
}

// A stored credential that fits no network here, or one that does.
void addCredential(World& world) {
    world.order("ADD_CREDENTIAL", ttlsData("elsewhere.example"));
}

void addFittingCredential(World& world) {
    world.order("ADD_CREDENTIAL", ttlsData("a.example", R"("AutoConnect":true)"));
}

/// There are one network and a credential, unless the case says otherwise.
struct Gate {
    std::string action;
    std::string line;
    std::string scenario = air({kNetwork});
    bool hasCredential = true;
};

Gate notDisconnected(const std::string& action, const std::string& name) {
    return {
        action,
        "Supplicant not in disconnected state, skip this round of network connecting. | Queried supplicant "
        "state=" +
            name};
}

std::vector<Gate> gates() {
    std::vector<Gate> all = {
        {kRadioOff, "Radio turned off, wait it be turned on."},
        {doing("radio", R"("hardware":"off")"), kNoNetwork, air({})},
        {"", kNoNetwork, "{}"},
        {"", kNoCredential, air({kNetwork}), false},
        {"", kNoCredential, air({network(1, "A")}), false},
        {doing("setSession", kAway), kAsleep},
    };
    const std::map<int, const char*> states = {{0, "InvalidState"},  {1, "Connected"},   {2, "InvalidState"},
                                               {3, "Disconnecting"}, {5, "Associating"}, {6, "Scanning"},
                                               {7, "Authenticating"}};
    for (const auto& [state, name] : states)
        all.push_back(notDisconnected(doing("interfaceState", R"("value":)" + std::to_string(state)), name));
    const std::string failure = failing("WlanQueryInterface", 31, R"("times":1000)");
    all.push_back(notDisconnected(failure, "InvalidState"));
    all.back().line = "WlanQueryInterface failed in Supplicant::queryState. | " + all.back().line;
    return all;
}

TEST(ConnectingThread, TellsInEachRoundWhichGateHeldIt) {
    for (const Gate& gate : gates())
        EXPECT_STORY(gate.scenario, [&](Story& story) {
            if (gate.hasCredential) addCredential(story);
            settle(story);
            if (!gate.action.empty()) story.perform(gate.action);
            story.advance(40s);
            const std::string told = roundsIn(story, 10s);
            // A round that sleeps is not over when ten seconds are.
            if (gate.line == kAsleep)
                story.expect("end of the rounds", told.substr(told.rfind('|') + 2), kAsleep);
            else
                story.expect("rounds", told, round(gate.line));
        }) << gate.action;
}

STORY(ConnectingThread, WithTheFunctionOffNoRoundAsksTheAdapterAnything, air({network(1, "A")})) {
    settle(story);
    story.play({kHs20Off, kRadioOff});
    story.advance(40s);
    const std::string off = round("HS20 functionality not enabled, wait for user turning it on.");
    story.expect("rounds", roundsIn(story, 30s), off + off + off);
    story.expect("calls", story.perform(R"({"query":"calls","all":true})").size(), 0U);
}

STORY(ConnectingThread, RunsARoundEveryTenSecondsWhenNothingHappens, "{}") {
    settle(story);
    std::string wanted;
    for (int i = 0; i < 6; ++i)
        wanted += round(kNoNetwork);
    story.expect("rounds", roundsIn(story, 60s), wanted);
}

STORY(ConnectingThread, AnUpdateWakesItTwiceOnceForTheListAndOnceForTheData, air({kNetwork})) {
    settle(story);
    story.perform(kReport);
    story.advance(0ms);
    story.expectLog({kListChanged, kAnqpReady});
    for (const auto& [line, times] : {std::pair(kListChanged, 1), {kAnqpReady, 1}, {kNoCredential, 2}})
        story.expect(line, count(story.messages(), line), times);
}

// All of them are signalled while the thread sleeps after a radio event, which has the last place.
STORY(ConnectingThread, TakesTheEventsThatWaitInTheirOrder, {.seed = 100, .seeds = 30}, air({kNetwork})) {
    settle(story);
    story.perform(kRadioOff);
    story.advance(1s);
    story.forget();
    story.perform(kRadioOn);
    addCredential(story);
    story.play({kReport, kHs20Off});
    story.advance(9s);
    std::string wakes;
    std::istringstream stream(story.messages());
    for (std::string line; std::getline(stream, line);)
        if (line.find(" signaled.") != std::string::npos) wakes += line.substr(0, line.find(' ')) + " ";
    story.expect("wakes", wakes, "Enable/disable HS20 Credential ANQP Supplicant Radio ");
}

STORY(ConnectingThread, SleepsTenSecondsAfterARadioEventBeforeItsGates, "{}") {
    settle(story);
    story.perform(kRadioOff);
    story.expect("before ten seconds", roundsIn(story, 9999ms), "");
    story.advance(1ms);
    story.expectLog({"Radio turned off, wait it be turned on."});
}

STORY(ConnectingThread, AsksForMissingDataFirstAndWaitsForTheEndOfTheQuery,
      air({kMute, network(2, "B", ttls())}, R"("anqpMs":3000)")) {
    addCredential(story);
    settle(story);
    story.advance(20s);
    const std::string told = roundsIn(story, 13s);
    story.expectLog(
        {"Not all HS20 network ANQP info fetched, we will query the ANQP info first before "
         "auto connecting.",
         "SIGMA: Enter Supplicant::queryHs20NetworkAnqpInfo.",
         "Supplicant::queryHs20NetworkAnqpInfo completed.", "ANQP querying finished."});
    story.expect("one network without data stops them all", count(told, "connectNetwork"), 0);
}

STORY(ConnectingThread, AQueryThatWasRefusedIsAskedAgainInTheNextRound, air({kMute})) {
    settle(story);
    story.perform(failing("WlanIhvControl", 31, R"("match":"anqpQuery","times":2)"));
    addCredential(story);
    story.expectLog({"WlanIhvControl call failed in sendIhvCmd with result code=31"});
    story.expect("waits", count(story.messages(), kQuerying), 0);
}

STORY(ConnectingThread, AnEndOfTheQueryThatBringsNoListLeavesTheQueryRunning,
      air({kMute}, R"("anqpMs":3000)")) {
    settle(story);
    story.perform(failing("WlanIhvControl", 31, R"("match":"bssList")"));
    addCredential(story);
    story.advance(5s);
    story.expect("rounds", roundsIn(story, 20s), round(kQuerying) + round(kQuerying));
    story.act("completeAnqpQuery");
    story.advance(0ms);
    story.expectLog({"ANQP querying finished."});
}

STORY(ConnectingThread, ARoundInADisconnectedSessionLastsFiveSecondsMore, air({kNetwork}, kAway)) {
    addCredential(story);
    settle(story);
    story.advance(40s);
    const std::string told = roundsIn(story, 60s);
    story.expect("rounds", count(told, kAsleep), 4);
    story.expect("attempts", count(told, "connectNetwork"), 0);
}

STORY(ConnectingThread, WithEveryGateOpenItFindsNothingToDoAndSaysSo, air({kNetwork})) {
    addCredential(story);
    settle(story);
    story.advance(20s);
    const std::string told = roundsIn(story, 10s);
    story.expect("beginning", told.starts_with(kTimeOut), true);
    story.expect("end", told.ends_with("connectNetwork returns with op cancelled.\n"), true);
}

STORY(ConnectingThread, WaitsForTheResultOfAnAttemptThatIsUnderWay,
      air({kNetwork}, R"("connectMs":100000)")) {
    addFittingCredential(story);
    settle(story);
    story.act("interfaceState", R"("value":4)");
    story.advance(20s);
    story.expect("rounds", roundsIn(story, 10s),
                 round("Connection already started, wait for connection operation completed event "
                       "signaled."));
}

STORY(ConnectingThread, ConnectsToNobodyUntilTheLastNetworkHasAnswered,
      air({kMute, network(2, "A", ttls())}, R"("connectMs":100000)")) {
    addFittingCredential(story);
    story.advance(100s);
    expectStanding(story, {.requests = ""});
    story.play({on("setNetwork", 1, R"("anqp":"ready",)" + tls("m.example")), kReport});
    story.advance(30s);
    expectStanding(story, {.requests = "A ttls user"});
}

void endsWhenTheAdapterGoes(const char* what, const std::vector<std::string>& before, int pauseMs,
                            const std::string& members = "") {
    EXPECT_STORY({.seed = 200, .seeds = 20}, air({kNetwork}, members), [&](Story& story) {
        const auto handles = [&] { return story.perform(R"({"query":"handles"})").asInt(); };
        addCredential(story);
        settle(story);
        const int handlesBefore = handles();
        for (const std::string& action : before)
            story.perform(action);
        story.advance(std::chrono::milliseconds(pauseMs));
        story.forget();
        story.act("pullAdapter");
        story.advance(30s);
        story.play({doing("insertAdapter"), kRadioOn});
        story.advance(30s);
        story.act("pullAdapter");
        story.expect("ends", count(story.messages(), kEnds), 2);
        story.expect("ends in order", count(story.messages(), "Deinitialize supplicant completed."), 2);
        story.expect("handles", handles(), handlesBefore - 1);
    }) << what;
}

TEST(ConnectingThread, EndsWhereverItIsWhenTheAdapterGoes) {
    endsWhenTheAdapterGoes("waiting", {}, 0);
    endsWhenTheAdapterGoes("waiting in the middle", {}, 4000);
    endsWhenTheAdapterGoes("asleep after the radio", {kRadioOff}, 3000);
    endsWhenTheAdapterGoes("asleep after the radio for no time yet", {kRadioOff}, 0);
    endsWhenTheAdapterGoes("asleep at the session gate", {kReport}, 2000, kAway);
}

// The seed decides whether the sleep or the wait for its end is over first, at the same moment.
TEST(ConnectingThread, OneThatIsLateLeavesItsLineAndEndsByItself) {
    std::string late;
    for (std::uint64_t seed = 300; seed < 360; ++seed) {
        const Ending ending = runStory({.seed = seed}, air({kNetwork}), [](Story& story) {
            addCredential(story);
            settle(story);
            story.play({kRadioOff, doing("pullAdapter"), doing("insertAdapter")});
            story.advance(60s);
            story.expect("ends", count(story.messages(), kEnds), 1);
            const char* const line = "Time out when waiting for network connecting thread termination.";
            if (count(story.messages(), line) == 1) story.tell("late");
        });
        EXPECT_EQ(ending.wrong, "");
        late += ending.told;
    }
    EXPECT_NE(late, "") << "no seed was late";
}

STORY(ConnectingThread, AServiceThatStopsWhileItSleepsStopsInOrder, {.seed = 400, .seeds = 20},
      air({kNetwork})) {
    settle(story);
    story.perform(kRadioOff);
}

}  // namespace
}  // namespace vexa::test
