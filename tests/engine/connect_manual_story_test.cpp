#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

/// Auto-connect has nothing to do in these stories: every credential waits for the user's hand.
StoredCredential byHand(int id, bool isTls = false, const std::string& realm = "a.example") {
    return {.id = id, .realm = realm, .isTls = isTls, .autoConnect = false};
}

constexpr auto kBehindStart = 6s;
const std::string kOne = air({kCafe}, storing({byHand(1)}));
const std::string kSlow = doing("set", R"("connectMs":5000)");

/// The user asks for a network by its name.
void asksFor(const std::string& what, const std::string& name, const std::vector<std::string>& networks,
             const Standing& end, const std::vector<StoredCredential>& credentials = {byHand(1)}) {
    EXPECT_STORY(air(networks, storing(credentials)), [&](Story& story) {
        settle(story, kBehindStart, {connecting(name), passing(5s)});
        expectStanding(story, end);
    }) << what;
}

TEST(ManualConnect, TriesWhatFitsInOrderAndTellsOneResult) {
    const std::string walk = "cafe ttls u1; cafe tls ca2 machineOrUser; cafe tls ca2 machine; cafe ttls u3";
    asksFor("a network that lets it in", "cafe", {kCafe}, {"cafe ttls u1", "1 access", "cafe", 2});
    asksFor("every credential in order, with one result for all", "cafe", {network(1, "cafe", both())},
            {walk, "0 no access", "-", 0}, {byHand(1), byHand(2, true), byHand(3)});
    asksFor("the credential that is let in, behind others", "cafe",
            {network(1, "cafe", both() + "," + lettingIn(R"({"eapMethod":21,"username":"u3"})"))},
            {walk, "1 access", "cafe", 2}, {byHand(1), byHand(2, true), byHand(3), byHand(4)});
}

TEST(ManualConnect, AsksForNothingWhereThereIsNoSuchNetwork) {
    const std::string longName = "0123456789abcdef0123456789abcdef";
    const Standing failure{"", "0", "-", -1};
    asksFor("a name that is in no list", "hotel", {kCafe}, failure);
    asksFor("33 bytes, however they begin", longName + "!", {open(1, longName, ttls())}, failure);
    asksFor("289 bytes, which would be 33", repeat("cafe", 72) + "!", {kCafe}, failure);
    asksFor("a name that goes on behind a NUL", {"cafe\0x", 6}, {kCafe}, failure);
    asksFor("no name", "", {kCafe}, {"", "", "-", -1});
    asksFor("a network without realm data", "cafe", {open(1, "cafe", R"("anqp":"never")")},
            {"", "", "-", -1});
}

// Two of them are text: what the list shows for the first, and the mark for what is no text.
TEST(ManualConnect, JoinsAndLeavesByTheNamesThatTheListShowsWhatHasNoTextForAName) {
    const std::pair<std::string, std::string> names[] = {{"Caf\xE9", R"(Caf\xE9)"},
                                                         {"Caf\xE9s", R"(Caf\xE9s)"},
                                                         {"\xE9", R"(\xE9)"},
                                                         {"\xFF\\xFF", R"(\xFF\x5CxFF)"},
                                                         {R"(Caf\xE9)", R"(Caf\x5CxE9)"},
                                                         {"\xEF\xBF\xBD", "\uFFFD"},
                                                         {repeat("\xE9", 32), repeat(R"(\xE9)", 32)}};
    std::vector<std::string> networks;
    for (const auto& [ssid, shown] : names)
        networks.push_back(R"({"bssid":"02:aa:00:00:00:0)" + std::to_string(networks.size()) +
                           R"(","ssidHex":")" + hexOf(bytesOfText(ssid)) + "\"," + ttls() + "," +
                           lettingIn(R"({"eapMethod":21})") + "}");
    EXPECT_STORY(air(networks, storing({byHand(1)})), [&](Story& story) {
        settle(story, kBehindStart);
        std::string list;
        for (const auto& [ssid, shown] : names)
            list += (list.empty() ? "" : " ") + shown + "[a.example TTLS]";
        story.expect("list", askedList(story), list);
        for (const auto& [ssid, shown] : names) {
            story.forget();
            story.play({connecting(shown), passing(5s), disconnecting(shown), passing(5s)});
            story.expect(shown, joined(requests(story)), ssid + " ttls u1; disconnect");
        }
    });
}

TEST(ManualConnect, LeavesToTheSystemWhatNoCredentialFits) {
    const std::string elsewhere = network(1, "cafe", ttls("other.example"));
    const std::string known = R"("osProfile":true,)";
    asksFor("a network that it knows", "cafe", {network(1, "cafe", known + ttls("other.example"))},
            {"plain cafe", "", "cafe", 0});
    asksFor("one that it doesn't know", "cafe", {elsewhere}, {"plain cafe", "", "-", 0});
    asksFor("no hotspot", "cafe", {network(1, "cafe", R"("hs20":false,)" + known + ttls())},
            {"plain cafe", "", "cafe", 0});
    asksFor("the beginning of a name, as it was asked for", "caf", {elsewhere}, {"plain caf", "", "-", 0});
}

STORY(ManualConnect, TellsInTheLogHowItWalksThroughTheCredentials,
      air({network(1, "cafe", both())}, storing({byHand(1), byHand(2, true), byHand(3)}))) {
    const std::string tries = "Try to connect to HS20 network using next credential.";
    const std::string fails = "Manual connection failed, we will try to use next credential.";
    const std::string skips = "We have tried credential with id=";
    settle(story, kBehindStart, {connecting("cafe"), passing(5s)});
    story.expectLog(
        "###Manually connect to a BSS started.###",
        "###We are actually going to connect to HS20 network now.###",
        "Unblocked network with ssid=cafe and mac address=02:aa:00:00:00:01 due to user has "
        "manually connected to it.",
        tries, "Selecting credential with id=1", "Manual connection started.",
        "Connection failed! profile name=cafe", fails, tries, skips + "1, skipping...",
        "Selecting credential with id=2", "connResult=1 after invoking tryConnectHs20BssUsingNextCredential.",
        "Successfully initiated connection to HS20 network=cafe using next credential.", fails,
        "Selecting credential with id=3", fails, skips + "1, skipping...", skips + "2, skipping...",
        skips + "3, skipping...", "connResult=2 after invoking tryConnectHs20BssUsingNextCredential.",
        "We have tried all credentials, connection failed.", "Send connection result to vexa.");
}

STORY(ManualConnect, ARefusedRequestIsToldAtOnceAndLeavesNothingBehind, kOne) {
    settle(story, kBehindStart, {failing("WlanConnect", 50), connecting("cafe")});
    expectStanding(story, {.requests = "cafe ttls u1 = 50", .outcomes = "0"});
    story.expectLog("WlanConnect call failed with error code=50.", "Try to connect to HS20 network failed.",
                    "connectBss failed.");
    story.forget();
    story.play({connecting("cafe"), passing(5s)});
    expectStanding(story, {.requests = "cafe ttls u1", .connected = "cafe"});
}

// Neither then nor later does a credential go out that waits for the user's hand.
STORY(ManualConnect, OfWhatIsConnectedIsASuccessAndLeavesNothingBehind,
      air({kCafe}, storing({byHand(2), {.id = 1}}))) {
    settle(story, kBehindStart, {connecting("cafe"), passing(5s)});
    expectStanding(story, {.requests = "", .connected = "cafe", .outcomes = "1"});
    story.expectLog("Selecting credential with id=2", "Connect to network cafe",
                    "Already in connected state while requesting to connect to the same network, skip "
                    "connecting again.");
    story.play({doing("userDisconnect", R"("ssid":"cafe")"), doing("dropConnection"), passing(30s)});
    expectStanding(story, {.requests = "", .connected = "-"});
    story.play({on("setNetwork", 1, lettingIn("")), kRadioOff, kRadioOn, passing(60s)});
    expectStanding(story, {.requests = "cafe ttls u1; cafe ttls u1"});
}

// The cached state follows the WLAN service, and what is connected is what the service says.
TEST(ManualConnect, IsNeedlessOnlyWhereTheServiceSaysThatItIsConnected) {
    const auto state = [](std::string value) { return doing("interfaceState", R"("value":)" + value); };
    const std::string home = doing("osConnect", R"("ssid":"home")");
    const std::vector<std::string> cases[] = {
        {connecting("cafe"), passing(1s), state("5"), connecting("cafe")},
        {state("7"), connecting("cafe"), passing(1s), state("null"), connecting("cafe")},
        {connecting("cafe"), passing(1s), home, passing(1s), connecting("cafe")}};
    for (const std::vector<std::string>& deeds : cases)
        EXPECT_STORY(kOne, [&](Story& story) {
            settle(story, kBehindStart, deeds);
            expectStanding(story, {.requests = "cafe ttls u1; cafe ttls u1"});
        }) << joined(deeds);
}

STORY(ManualConnect, WhatIsBeingJoinedIsNotConnectedYetButCanBeLeft, kOne) {
    settle(story, kBehindStart, {kSlow, connecting("cafe"), passing(1s), sending("GET_IS_INTERNET_ACCESS")});
    expectStanding(story, {.results = "no access"});
    story.expect("list", askedList(story), "cafe[a.example TTLS]");
    story.play({doing("interfaceState", R"("value":7)"), disconnecting("cafe")});
    expectStanding(story, {.requests = "cafe ttls u1; disconnect"});
}

STORY(ManualConnect, ANextCredentialThatCanNotStartEndsWithoutAWord,
      air({network(1, "cafe", ttls())}, storing({byHand(1), byHand(2)}))) {
    settle(story, kBehindStart, {failing("WlanConnect", 50, R"("skip":1)"), connecting("cafe"), passing(5s)});
    expectStanding(story, {.requests = "cafe ttls u1; cafe ttls u2 = 50", .outcomes = ""});
    story.expectLog("connResult=0 after invoking tryConnectHs20BssUsingNextCredential.",
                    "ERROR: Try to connect to HS20 network using next credential failed.");
}

// The system's own connections carry nothing of this program, whatever their outcome.
void isForeign(const std::string& succeeds, const std::string& result, const std::string& connected) {
    EXPECT_STORY(kOne, [&](Story& story) {
        const std::string members = R"("ssid":"home","succeeds":)" + succeeds;
        settle(story, kBehindStart, {doing("osConnect", members), passing(1s)});
        expectStanding(story, {.connected = connected, .eapMethod = 0, .outcomes = "1 no access"});
        story.expectLog("Connection start event: connection not initiated by HS20, profile name=home",
                        "Connection result not initiated by HS20, profile name=home, result=" + result,
                        "Send connection result to vexa.");
        const int withoutStart = count(story.messages(), "m_bConnectionStartedByOs is not set");
        story.expectOfLog("results without a start", withoutStart, 0);
    });
}

TEST(ForeignConnection, IsToldAsASuccessWhateverItsOutcome) {
    isForeign("true", "Success", "home");
    isForeign("false", "Failure", "-");
}

STORY(ForeignConnection, ThatDisplacesOursEndsItAndIsToldApart, kOne) {
    settle(story, kBehindStart,
           {kSlow, connecting("cafe"), passing(500ms), doing("osConnect", R"("ssid":"home")"), passing(8s)});
    expectStanding(story, {.connected = "home", .eapMethod = 0, .outcomes = "0 no access 1 no access"});
}

// The result of another network whose name begins like the one asked for counts as its own.
STORY(ForeignConnection, ALongerNameWithTheSameBeginningCountsAsOwn,
      air({kCafe, network(2, "cafeteria", ttls("x.example"))}, storing({byHand(1)}))) {
    settle(story, kBehindStart,
           {kSlow, connecting("cafe"), passing(1s),
            doing("connection", R"("code":10,"profileName":"cafe","ssidHex":"636166657465726961")")});
    expectStanding(story, {.eapMethod = 2, .outcomes = "1 no access"});
    story.expectLog("Connection result initiated by HS20, clearing the cache, profile name=cafe.",
                    "Connection succeeded! profile name=cafe");
}

void endsWithItsLine(const std::string& result, const char* line) {
    EXPECT_STORY(kOne, [&](Story& story) {
        settle(story, kBehindStart, {kSlow, connecting("cafe"), result});
        expectStanding(story, {.eapMethod = 0, .outcomes = ""});
        story.expectLog(line);
    }) << line;
}

TEST(ConnectionResult, WithoutAProfileOrDataEndsWithItsLineAlone) {
    endsWithItsLine(doing("notify", R"("source":8,"code":10)"),
                    "ERROR: No wlan connection notification data.");
    endsWithItsLine(doing("connection", R"("code":10,"profileName":"cafe","ssidHex":"")"),
                    "ERROR: Invalid ssid or ssid length.");
    endsWithItsLine(doing("connection", R"("code":10,"profileName":"other","ssidHex":"63616665")"),
                    "ERROR: Cannot get profile in profile manager.");
}

/// While auto-connect is on its way into the cafe the user asks for these networks.
void waits(const char* what, const char* accepts, const std::vector<std::string>& asked,
           const Standing& end) {
    const std::string scenario = air({network(1, "cafe", ttls() + "," + lettingIn(accepts)), kHotel},
                                     storing({{}, byHand(2, false, "b.example")}) + R"(,"connectMs":1000)");
    EXPECT_STORY(scenario, [&](Story& story) {
        story.advance(500ms);
        story.hotspot().events();
        story.play(asked);
        story.advance(8s);
        expectStanding(story, end);
        story.expectLog(
            "###Manually connect to a BSS started.###",
            "\tConnection has already been started, maybe by auto connecting thread, we will wait "
            "until the auto connecting completed, either succeed or fail.",
            "Connection result initiated by HS20, clearing the cache, profile name=cafe.",
            "###User manual connecting request pending, we are going to connect now.###",
            "###We are actually going to connect to HS20 network now.###");
        story.play({kHs20Off, passing(1s)});
        expectStanding(story, {.connected = "-"});
    }) << what;
}

TEST(PendingRequest, RunsWhenTheRunningAttemptHasEndedAndIsAllThatTheClientHears) {
    const char* const all = R"({"eapMethod":21})";
    const Standing inTheHotel{"cafe ttls u1; hotel ttls u2", "1 access", "hotel"};
    waits("after a success", all, {connecting("hotel")}, inTheHotel);
    waits("after a failure", "", {connecting("hotel")}, inTheHotel);
    waits("the last of two", "", {connecting("cafe"), connecting("hotel")}, inTheHotel);
    waits("the network that is just being joined", all, {connecting("cafe")},
          {"cafe ttls u1; cafe ttls u1", "1 access", "cafe"});
}

TEST(PendingRequest, ThatCanNotBeginLeavesTheAttemptThatRanAsItIs) {
    const char* const all = R"({"eapMethod":21})";
    const std::string mute = adding(network(3, "mute", R"("anqp":"never")"));
    const std::string refused = failing("WlanConnect", 50);
    waits("one that is in no list", all, {connecting("motel")}, {"cafe ttls u1", "0 1 access", "cafe", 2});
    waits("a refused one", all, {refused, connecting("hotel")},
          {"cafe ttls u1; hotel ttls u2 = 50", "0 1 access", "cafe", 2});
    waits("one whose realms aren't known", all, {mute, kReport, connecting("mute")},
          {"cafe ttls u1", "1 access", "cafe", 2});
    waits("after a failure", "", {connecting("motel")}, {"cafe ttls u1", "0 0 no access", "-", 0});
}

STORY(PendingRequest, ThatIsRefusedLeavesItsNetworkTheProfileThatItHas,
      air({open(1, "cafe", both())}, storing({byHand(2), {.isTls = true}}) + R"(,"connectMs":1000)")) {
    story.play({passing(500ms), failing("WlanConnect", 50), connecting("cafe"), passing(5s)});
    expectStanding(story, {"cafe tls ca1 machineOrUser; cafe ttls u2 = 50", "0 1 access", "cafe", 1});
}

// What the system joins is no walk: behind it auto-connect doesn't go on with what waits for the user's hand.
STORY(PendingRequest, ThatIsLeftToTheSystemEndsTheWalkByHand,
      air({network(1, "cafe", ttls()), network(2, "other", ttls("x.example") + R"(,"osProfile":true)")},
          storing({{}, byHand(2)}) + R"(,"connectMs":1000)")) {
    story.play({passing(500ms), connecting("cafe"), passing(1s), connecting("other"), passing(3s)});
    expectStanding(story, {.connected = "other"});
    story.play({doing("dropConnection"), passing(60s)});
    expectStanding(story, {.requests = "cafe ttls u1; cafe ttls u1; plain other; cafe ttls u1"});
}

STORY(PendingRequest, ThatIsRefusedLeavesTheWalkByHandWhereItWas,
      air({network(1, "cafe", ttls()), kHotel},
          storing({byHand(1), byHand(3), byHand(2, false, "b.example")}) + R"(,"connectMs":1000)")) {
    story.play(
        {connecting("cafe"), passing(500ms), failing("WlanConnect", 50), connecting("hotel"), passing(8s)});
    expectStanding(story, {"cafe ttls u1; hotel ttls u2 = 50; cafe ttls u3", "0 0 no access", "-", 0});
}

}  // namespace
}  // namespace vexa::test
