#include <gtest/gtest.h>

#include <sstream>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

const std::string kTimeOut = "Timeout happens in the network connecting thread.";
constexpr const char* kListChanged = "HS20 network list changed event signaled.";
constexpr const char* kAnqpReady = "ANQP info ready event signaled.";
constexpr const char* kNoNetwork = "No HS20 BSS, wait for HS20 network list change.";
constexpr const char* kNoCredential = "No credential, wait for user to add credential.";
constexpr const char* kQuerying = "We are querying the HS20 network ANQP info, wait.";
constexpr const char* kEnds = "The NetworkingMgr thread is to be terminated...";

const std::string kNetwork = network(1, "A", ttls());
const std::string kMute = network(1, "Mute", R"("anqp":"never")");

const std::string kAway = doing("setSession", R"("session":"disconnected")");

// A stored credential that fits no network here, and one that does.
const std::string kCredential = sending("ADD_CREDENTIAL", ttlsData("elsewhere.example"));
const std::string kFitting = sending("ADD_CREDENTIAL", ttlsData("a.example", R"("AutoConnect":true)"));

// What the log tells of the rounds while this time passes.
std::string roundsIn(World& world, platform::Duration span) {
    world.forget();
    world.advance(span);
    return rounds(world);
}

std::string round(const std::string& gate) {
    return kTimeOut + " | " + gate + "\n";
}

/// When all this has happened, a round begins every ten seconds and this gate holds it.
void holds(const std::string& gate, const std::vector<std::string>& deeds,
           const std::string& scenario = air({kNetwork})) {
    EXPECT_STORY(scenario, [&](Story& story) {
        settle(story, deeds);
        story.advance(40s);
        story.expectOfLog("rounds", roundsIn(story, 30s), round(gate) + round(gate) + round(gate));
    }) << gate;
}

TEST(ConnectingThread, TellsInEachRoundWhichGateHeldIt) {
    holds("Radio turned off, wait it be turned on.", {kCredential, kRadioOff});
    holds(kNoNetwork, {}, "{}");
    holds(kNoNetwork, {kCredential, doing("radio", R"("hardware":"off")")}, air({}));
    holds(kNoCredential, {});
    holds(kNoCredential, {}, air({network(1, "A")}));
    holds("Connection already started, wait for connection operation completed event signaled.",
          {kFitting, doing("interfaceState", R"("value":4)")}, air({kNetwork}, R"("connectMs":100000)"));
}

TEST(ConnectingThread, GoesOnOnlyWithASupplicantThatIsDisconnected) {
    const std::string skips =
        "Supplicant not in disconnected state, skip this round of network connecting. | ";
    const std::string state = "Queried supplicant state=";
    holds("WlanQueryInterface failed in Supplicant::queryState. | " + skips + state + "InvalidState",
          {kCredential, failing("WlanQueryInterface", 31, R"("times":1000)")});
    const std::pair<int, const char*> states[] = {
        {0, "InvalidState"}, {1, "Connected"}, {2, "InvalidState"},  {3, "Disconnecting"},
        {5, "Associating"},  {6, "Scanning"},  {7, "Authenticating"}};
    for (const auto& [number, name] : states)
        holds(skips + state + name,
              {kCredential, doing("interfaceState", R"("value":)" + std::to_string(number))});
}

STORY(ConnectingThread, WithTheFunctionOffNoRoundAsksTheAdapterAnything, air({network(1, "A")})) {
    settle(story, {kHs20Off, kRadioOff, passing(40s)});
    const std::string off = round("HS20 functionality not enabled, wait for user turning it on.");
    story.expectOfLog("rounds", roundsIn(story, 30s), off + off + off);
    story.expect("calls", story.perform(R"({"query":"calls","all":true})").size(), 0U);
}

STORY(ConnectingThread, AnUpdateWakesItTwiceOnceForTheListAndOnceForTheData, air({kNetwork})) {
    settle(story, {kReport, passing(0ms)});
    story.expectLog(kListChanged, kAnqpReady);
    for (const auto& [line, times] : {std::pair(kListChanged, 1), {kAnqpReady, 1}, {kNoCredential, 2}})
        story.expectOfLog(line, count(story.messages(), line), times);
}

// All of them are signalled while the thread sleeps after a radio event, which has the last place.
STORY(ConnectingThread, TakesTheEventsThatWaitInTheirOrder, {.seed = 100, .seeds = 30}, air({kNetwork})) {
    settle(story, {kRadioOff, passing(1s)});
    story.forget();
    story.play({kRadioOn, kCredential, kReport, kHs20Off, passing(9s)});
    std::string wakes;
    std::istringstream stream(story.messages());
    for (std::string line; std::getline(stream, line);)
        if (line.find(" signaled.") != std::string::npos) wakes += line.substr(0, line.find(' ')) + " ";
    story.expectOfLog("wakes", wakes, "Enable/disable HS20 Credential ANQP Supplicant Radio ");
}

STORY(ConnectingThread, SleepsTenSecondsAfterARadioEventBeforeItsGates, "{}") {
    settle(story, {kRadioOff, passing(0ms)});
    story.expectOfLog("before ten seconds", roundsIn(story, 9999ms), "");
    story.advance(1ms);
    story.expectLog("Radio turned off, wait it be turned on.");
    story.expectOfLog("before ten seconds more", roundsIn(story, 9999ms), "");
    story.advance(1ms);
    story.expectLog(kTimeOut);
}

STORY(ConnectingThread, AsksForMissingDataFirstAndWaitsForTheEndOfTheQuery,
      air({kMute, network(2, "B", ttls())}, R"("anqpMs":3000)")) {
    story.play({kCredential, kAway});
    settle(story);
    story.advance(20s);
    const std::string told = roundsIn(story, 13s);
    story.expectLog(
        "Not all HS20 network ANQP info fetched, we will query the ANQP info first before "
        "auto connecting.",
        "SIGMA: Enter Supplicant::queryHs20NetworkAnqpInfo.",
        "Supplicant::queryHs20NetworkAnqpInfo completed.", "ANQP querying finished.");
    story.expectOfLog("one network without data stops them all", count(told, "connectNetwork"), 0);
}

STORY(ConnectingThread, AQueryThatWasRefusedIsAskedAgainInTheNextRound, air({kMute})) {
    settle(story, {failing("WlanIhvControl", 31, R"("match":"anqpQuery","times":2)"), kCredential});
    story.expectLog("WlanIhvControl call failed in sendIhvCmd with result code=31");
    story.expectOfLog("waits", count(story.messages(), kQuerying), 0);
}

STORY(ConnectingThread, AnEndOfTheQueryThatBringsNoListLeavesTheQueryRunning,
      air({kMute}, R"("anqpMs":3000)")) {
    settle(story, {failing("WlanIhvControl", 31, R"("match":"bssList")"), kCredential, passing(5s)});
    story.expectOfLog("rounds", roundsIn(story, 20s), round(kQuerying) + round(kQuerying));
    story.play({doing("completeAnqpQuery"), passing(0ms)});
    story.expectLog("ANQP querying finished.");
}

STORY(ConnectingThread, ARoundInADisconnectedSessionLastsFiveSecondsMore, air({kNetwork})) {
    story.play({kCredential, kAway});
    settle(story);
    story.advance(40s);
    const std::string told = roundsIn(story, 60s);
    story.expectOfLog(
        "rounds", count(told, kTimeOut + " | Current session is not active, sleep for a while and continue."),
        4);
    story.expectOfLog("attempts", count(told, "connectNetwork"), 0);
}

STORY(ConnectingThread, WithEveryGateOpenItFindsNothingToDoAndSaysSo, air({kNetwork})) {
    story.play({kCredential});
    settle(story);
    story.advance(20s);
    const std::string told = roundsIn(story, 10s);
    story.expectOfLog("beginning", told.starts_with(kTimeOut), true);
    story.expectOfLog("end", told.ends_with("connectNetwork returns with op cancelled.\n"), true);
}

STORY(ConnectingThread, ConnectsToNobodyUntilTheLastNetworkHasAnswered,
      air({kMute, network(2, "A", ttls())}, R"("connectMs":100000)")) {
    story.play({kFitting, passing(100s)});
    expectStanding(story, {.requests = ""});
    story.play({on("setNetwork", 1, R"("anqp":"ready",)" + tls("m.example")), kReport, passing(30s)});
    expectStanding(story, {.requests = "A ttls user"});
}

void endsWhenTheAdapterGoes(const char* what, int pauseMs, const std::vector<std::string>& before) {
    EXPECT_STORY({.seed = 200, .seeds = 20}, air({kNetwork}), [&](Story& story) {
        const auto handles = [&] { return story.perform(R"({"query":"handles"})").asInt(); };
        story.play({kCredential});
        settle(story);
        const int handlesBefore = handles();
        story.play(before);
        story.advance(std::chrono::milliseconds(pauseMs));
        story.forget();
        story.play({doing("pullAdapter"), passing(30s), doing("insertAdapter"), kRadioOn, passing(30s),
                    doing("pullAdapter")});
        story.expectOfLog("ends", count(story.messages(), kEnds), 2);
        story.expectOfLog("ends in order", count(story.messages(), "Deinitialize supplicant completed."), 2);
        story.expect("handles", handles(), handlesBefore - 1);
    }) << what;
}

TEST(ConnectingThread, EndsWhereverItIsWhenTheAdapterGoes) {
    endsWhenTheAdapterGoes("waiting", 0, {});
    endsWhenTheAdapterGoes("waiting in the middle", 4000, {});
    endsWhenTheAdapterGoes("asleep after the radio", 3000, {kRadioOff});
    endsWhenTheAdapterGoes("asleep after the radio for no time yet", 0, {kRadioOff});
    endsWhenTheAdapterGoes("asleep at the session gate", 2000, {kAway, kReport});
}

// The sleep is as long as the wait for its end, and one that began at the same moment counts as late.
TEST(ConnectingThread, OneThatIsLateLeavesItsLineAndEndsByItself) {
    const char* const line = "Time out when waiting for network connecting thread termination.";
    for (const int pauseMs : {0, 1})
        EXPECT_STORY({.seed = 300, .seeds = 30}, air({kNetwork}), [&](Story& story) {
            story.play({kCredential});
            settle(story, {kRadioOff, passing(std::chrono::milliseconds(pauseMs)), doing("pullAdapter"),
                           doing("insertAdapter"), passing(60s)});
            story.expectOfLog("ends", count(story.messages(), kEnds), 1);
            story.expectOfLog(line, count(story.messages(), line), pauseMs == 0 ? 1 : 0);
        }) << pauseMs;
}

STORY(ConnectingThread, AServiceThatStopsWhileItSleepsStopsInOrder, {.seed = 400, .seeds = 20},
      air({kNetwork})) {
    settle(story, {kRadioOff});
}

}  // namespace
}  // namespace vexa::test
