#include <gtest/gtest.h>

#include <algorithm>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;
using std::chrono::milliseconds;

const std::string kUserLeft = doing("userDisconnect", R"("ssid":"cafe")");
constexpr const char* kBlocks = "We are going to block network with ssid=cafe\n";
/// So much older is all that happened before; younger too, by a clock that was set back.
std::string aging(int ms) {
    return doing("shiftTime", R"("ms":)" + std::to_string(ms));
}

constexpr const char* kSlow = R"(,"connectMs":2000)";

/// A story that begins in the cafe, which was joined by itself; the hotel is for the user's hand.
void inTheCafe(const std::string& what, const Tale& tale) {
    const StoredCredential byHand{.id = 2, .realm = "b.example", .autoConnect = false};
    EXPECT_STORY(air({kCafe, kHotel}, storing({{}, byHand})), [&](Story& story) {
        story.advance(5s);
        expectStanding(story, {.connected = "cafe"});
        story.forget();
        tale(story);
    }) << what;
}

int blocks(Story& story) {
    return count(story.messages(), kBlocks);
}

TEST(Disconnect, KeepsAutoConnectAwayUntilTheUserAsksAgain) {
    inTheCafe("", [](Story& story) {
        story.play({disconnecting("cafe")});
        expectStanding(story, {.requests = "disconnect", .eapMethod = 0, .outcomes = "networks"});
        story.advance(120s);
        expectStanding(story, {.requests = "disconnect", .connected = "-"});
        story.expectLog("Disconnecting from connecting/connected BSS...",
                        "Manually disconnect from a HS20 network.",
                        "We are going to block network with ssid=cafe",
                        "The network with ssid=cafe and mac address=02:aa:00:00:00:01 has been blocked due "
                        "to user manually disconnect from this network.",
                        "Received Wlan disconnected event.", "Reason code desc=The user disconnected.",
                        "This network has been disconnected by user, skip auto connecting to ssid=cafe",
                        "No matching network was found based on configured credentials.");
        story.play({connecting("cafe"), passing(5s)});
        expectStanding(story, {.connected = "cafe"});
        story.play({doing("dropConnection"), passing(5s)});
        expectStanding(story, {.connected = "cafe"});
    });
}

TEST(Disconnect, OfWhatIsNotConnectedChangesNothing) {
    for (const std::string& name : {std::string("cafe\0x", 6), std::string("hotel"), std::string("caf")})
        inTheCafe(name, [&](Story& story) {
            story.play({disconnecting(name), passing(5s)});
            expectStanding(story, {.requests = "", .connected = "cafe"});
            story.expectLog("ERROR: Connected ssid=cafe while requesting disconnect from ssid=" +
                            name.substr(0, name.find('\0')));
        });
}

STORY(Disconnect, WithNothingConnectedSaysSo, air({kCafe})) {
    story.play({passing(5s), disconnecting("cafe")});
    expectStanding(story, {.requests = ""});
    story.expectLog("ERROR: Cannot get connected BSS.");
}

// One result, and no next step: neither for the machine nor with another credential.
void endsForGood(const std::string& request, const std::vector<StoredCredential>& credentials,
                 const std::vector<std::string>& deeds = {}) {
    EXPECT_STORY(air({open(1, "cafe", both())}, storing(credentials) + kSlow), [&](Story& story) {
        story.advance(1s);
        story.play(deeds);
        story.hotspot().events();
        story.play({disconnecting("cafe"), passing(60s)});
        expectStanding(story, {request + "; disconnect", "0 no access", "-", 0});
        story.expectLog("Connection failed! profile name=cafe",
                        "Reason code desc=The connection was cancelled.");
    }) << request;
}

TEST(Disconnect, InTheMiddleOfAnAttemptEndsItForGood) {
    endsForGood("cafe tls ca1 machineOrUser", {{.isTls = true}});
    endsForGood("cafe ttls u1", {{}});
    endsForGood("cafe ttls u1", {{.autoConnect = false}, {.id = 2, .autoConnect = false}},
                {connecting("cafe"), passing(1s)});
}

// The flag that says so is gone with the first result: the next attempt fails as any other.
STORY(Disconnect, IsForgottenWithTheNextResult,
      air({network(1, "cafe", tls())}, storing({{.isTls = true, .autoConnect = false}}) + kSlow)) {
    story.play({passing(1s), connecting("cafe"), passing(1s), disconnecting("cafe"), passing(5s)});
    story.forget();
    story.play({connecting("cafe"), passing(10s)});
    expectStanding(story, {.requests = "cafe tls ca1 machineOrUser; cafe tls ca1 machine"});
}

STORY(UserLeavesBySystem, BlocksTheNetworkThatIsConnected,
      air({kCafe, kHotel}, storing({{}, {.id = 2, .realm = "b.example"}}))) {
    story.advance(5s);
    expectStanding(story, {.connected = "cafe"});
    story.play({kUserLeft, doing("dropConnection", R"("reason":163842)"), passing(60s)});
    expectStanding(story, {.connected = "hotel"});
}

/// What came a second before the report, which is no act of the user against the network then.
void blocksNothing(const std::vector<std::string>& before, const std::string& report,
                   std::vector<std::string> lines) {
    inTheCafe(lines.back(), [&](Story& story) {
        story.play(before);
        settle(story, 1s);
        story.perform(report);
        lines.insert(lines.begin(),
                     "### IHV reports HS20 network has been disconnected manually by user. ###");
        story.expectLines(lines);
        story.expectOfLog("blocks", blocks(story), 0);
    });
}

TEST(UserLeavesBySystem, BlocksNothingThatMayBeASideEffect) {
    const std::string slow = doing("set", R"("connectMs":5000)");
    blocksNothing({doing("setSession", R"("session":"disconnected")")}, kUserLeft,
                  {"Current session is not active, don't update the blocked network list."});
    blocksNothing({kRadioOff}, kUserLeft, {"Radio turned off, don't update the blocked network list."});
    blocksNothing({kHs20Off}, kUserLeft, {"HS20 not enabled, don't update the blocked network list."});
    blocksNothing({slow, connecting("hotel")}, kUserLeft,
                  {"Manually connect to HS20 network started, this network maybe disconnected for we are "
                   "going to connect another network."});
    blocksNothing({slow, doing("osConnect", R"("ssid":"home")")}, kUserLeft,
                  {"Connection started by OS, HS20 network may be disconected,we should not block any HS20 "
                   "network from auto connecting in this case."});
}

TEST(UserLeavesBySystem, BlocksNothingForAnotherNetwork) {
    const std::string checks = "Check if the active connection is the connection to be disconnected.";
    blocksNothing(
        {}, doing("userDisconnect", R"("ssid":"hotel")"),
        {"Connection still in active.", checks,
         "Windows disconnected network with ssid=hotel while the active connection with ssid=cafe"});
    blocksNothing({}, doing("userDisconnect", R"("ssid":"cafe","isHs20":0)"),
                  {checks, "ERROR: Not a HS20 network."});
    blocksNothing({}, moduleMessage(5, bssRecord("02aa00000001", "cafe" + std::string(30, 'x'))), {checks});
}

STORY(UserLeavesBySystem, BlocksNothingBeforeTheFirstConnection, air({kCafe})) {
    story.play({passing(5s), kUserLeft});
    story.expectLog("No last connection history.");
    story.expectOfLog("blocks", blocks(story), 0);
}

// The network is hidden, so that its connection ends and no new one comes of it.
TEST(UserLeavesBySystem, BlocksUpToASecondAfterTheEndOfTheConnection) {
    for (const int pause : {-5000, 0, 999, 1000, 1001, 5000})
        inTheCafe(std::to_string(pause), [&](Story& story) {
            story.play({on("hide", 1), aging(pause), kUserLeft});
            story.expectLog("Connection disconnected earlier.");
            story.expectOfLog("blocks", blocks(story), pause <= 1000 ? 1 : 0);
        });
}

TEST(UserLeavesBySystem, BlocksFromTwoSecondsAfterTheFunctionWasSwitched) {
    for (const int pause : {-3000, 0, 1999, 2000, 2001})
        inTheCafe(std::to_string(pause), [&](Story& story) {
            story.play({kHs20Off, passing(5s), kHs20On, passing(500ms), aging(pause - 500)});
            expectStanding(story, {.connected = "cafe"});
            story.perform(kUserLeft);
            const std::string skips =
                "Skip blocking the network with ssid=cafe since we just toggled the enable/disable "
                "hs20, millisecond elapsed=" +
                std::to_string(std::max(pause, 0)) + "\n";
            story.expectOfLog("skips", count(story.messages(), skips), pause < 2000 ? 1 : 0);
            story.expectOfLog("blocks", blocks(story), pause < 2000 ? 0 : 1);
        });
}

// Also on a clock that was set back since: the switch seems to lie ahead, but there was none.
STORY(UserLeavesBySystem, BlocksRightAfterTheStart, air({kCafe}, storing({{}}))) {
    story.advance(300ms);
    expectStanding(story, {.connected = "cafe"});
    story.perform(kUserLeft);
    story.expectOfLog("blocks", blocks(story), 1);
}

// What the service found at its start counts as begun then.
STORY(UserLeavesBySystem, BlocksAConnectionThatIsOlderThanTheService,
      air({kCafe},
          storing({{}}) + R"(,"connectMs":0,"timeline":[{"atMs":0,"do":"osConnect","ssid":"cafe"}])")) {
    story.advance(1s);
    story.expect("list", askedList(story), "cafe*[a.example TTLS]");
    story.expectLog("Supplicant State=Initialized");
    story.play({kUserLeft, doing("dropConnection"), passing(60s)});
    expectStanding(story, {.requests = "", .connected = "-"});
}

void changesSession(const std::vector<std::string>& left, int pause, const char* connected,
                    std::vector<std::string> lines) {
    inTheCafe(std::to_string(pause) + lines.back(), [&](Story& story) {
        story.play(left);
        story.play({aging(pause), doing("sessionChange", R"("eventType":7,"sessionId":3)")});
        story.expectLog("### [Session] IHV reports session changed. ###", "\tEventType=7, sessionId=3",
                        "[Session] A session has been locked.", "Enter resetAllNumRetries.");
        story.expectLines(lines);
        story.advance(30s);
        expectStanding(story, {.connected = connected});
    });
}

TEST(SessionChange, OpensWhatWasBlockedLessThan800MillisecondsAgo) {
    const std::vector<std::string> bySystem = {kUserLeft, doing("dropConnection")};
    const std::string blocked = "The network with ssid=cafe has been blocked for ";
    for (const int pause : {0, 799})
        changesSession(bySystem, pause, "cafe",
                       {blocked + std::to_string(pause) + " millisec",
                        "\tThis network was blocked not long ago, unblock it"});
    for (const int pause : {800, 801, -1, -1000})
        changesSession(bySystem, pause, "-",
                       {blocked + std::to_string(pause) + " millisec",
                        "\tThis network was blocked long time ago, don't unblock it."});
    for (const int pause : {0, 799})
        changesSession({disconnecting("cafe")}, pause, "-",
                       {"This network with ssid=cafe has been blocked by user, don't unblock it."});
}

STORY(SessionChange, IsToldByItsKind, "{}") {
    const std::vector<std::string> kinds = {
        "Unknown event type.",
        "A session was connected to the console session.",
        "A session was disconnected from the console session.",
        "A session was connected to the remote session.",
        "A session was disconnected from the remote session.",
        "A user has logged on to the session.",
        "A user has logged off of the session.",
        "A session has been locked.",
        "A session has been unlocked.",
        "A session has changed its remote controlled status.",
    };
    for (const unsigned kind : {0U, 1U, 2U, 3U, 4U, 5U, 6U, 7U, 8U, 9U, 10U, 1000U}) {
        story.forget();
        story.act("sessionChange", R"("sessionId":2,"eventType":)" + std::to_string(kind));
        story.expectLog("\tEventType=" + std::to_string(kind) + ", sessionId=2",
                        "[Session] " + kinds[kind < kinds.size() ? kind : 0], "Enter resetAllNumRetries.");
    }
    story.forget();
    story.perform(moduleMessage(6, bytesOfHex("01000000020000")));
    story.expectOfLog("log of half a message", story.messages(),
                      "### [Session] IHV reports session changed. ###\n");
}

TEST(Unblocking, ByTheSystemsOwnConnectionTakesWhatIsFresh) {
    for (const int pause : {0, 799, 800})
        inTheCafe(std::to_string(pause), [&](Story& story) {
            story.play({kUserLeft, passing(milliseconds(pause)), doing("osConnect", R"("ssid":"home")"),
                        passing(5s), doing("dropConnection"), passing(30s)});
            expectStanding(story, {.connected = pause < 800 ? "cafe" : "-"});
        });
}

// What opens a network that the user has left by the client, or doesn't.
void opens(const char* what, const char* connected, const std::vector<std::string>& deeds) {
    const StoredCredential byHand{.id = 2, .autoConnect = false};
    EXPECT_STORY(air({open(1, "cafe", both())}, storing({{}, byHand})), [&](Story& story) {
        story.play({passing(5s), disconnecting("cafe"), passing(5s)});
        story.play(deeds);
        story.advance(60s);
        expectStanding(story, {.connected = connected});
    }) << what;
}

std::string addingCredential(const std::string& realm, const std::string& autoConnect) {
    return sending("ADD_CREDENTIAL", tlsData(realm, R"("AutoConnect":)" + autoConnect));
}

std::string lettingConnect(int id) {
    const std::string members = R"("AutoConnect":true,"Id":)" + std::to_string(id);
    return sending("EDIT_CREDENTIAL", ttlsData("a.example", members));
}

TEST(Unblocking, ByTheRightCredentialOrAFreshStartAlone) {
    opens("nothing", "-", {});
    opens("a credential that fits", "cafe", {addingCredential("a.example", "true")});
    opens("a credential for another realm", "-", {addingCredential("b.example", "true")});
    opens("a credential for the user's hand", "-", {addingCredential("a.example", "false")});
    opens("one that may connect now and might not before", "cafe", {lettingConnect(2)});
    opens("one that may connect now and might before", "-", {lettingConnect(1)});
    opens("the radio", "cafe", {kRadioOff, kRadioOn});
    opens("an arrival of the adapter", "cafe", {doing("insertAdapter")});
    opens("the function off and on", "-", {kHs20Off, kHs20On});
    opens("a session change", "-", {doing("sessionChange", R"("eventType":8,"sessionId":1)")});
}

}  // namespace
}  // namespace vexa::test
