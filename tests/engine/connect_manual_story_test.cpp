#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

/// Auto-connect has nothing to do in these stories: every credential waits for the user's hand.
StoredCredential byHand(int id, bool isTls = false, const std::string& realm = "a.example") {
    return {.id = id, .realm = realm, .isTls = isTls, .autoConnect = false};
}

/// A story that begins when the service has come to rest with these networks and credentials.
void atRest(const std::string& what, const std::vector<std::string>& networks,
            const std::vector<StoredCredential>& credentials, const Tale& tale) {
    EXPECT_STORY(air(networks, storing(credentials)), [&](Story& story) {
        story.advance(6s);
        story.forget();
        tale(story);
    }) << what;
}

/// The user asks for a network by its name.
void asksFor(const std::string& what, const std::string& name, const std::vector<std::string>& networks,
             const std::vector<StoredCredential>& credentials, const Standing& end) {
    atRest(what, networks, credentials, [&](Story& story) {
        connect(story, name);
        story.advance(5s);
        expectStanding(story, end);
    });
}

TEST(ManualConnect, TriesWhatFitsInOrderAndTellsOneResult) {
    const std::string walk = "cafe ttls u1; cafe tls ca2 machineOrUser; cafe tls ca2 machine; cafe ttls u3";
    asksFor("a network that lets the credential in", "cafe", {kCafe}, {byHand(1)},
            {"cafe ttls u1", "1 access", "cafe", 2});
    asksFor("every credential in order, with one result for all", "cafe", {network(1, "cafe", both())},
            {byHand(1), byHand(2, true), byHand(3)}, {walk, "0 no access", "-", 0});
    asksFor("the credential that is let in, behind others", "cafe",
            {network(1, "cafe", both() + "," + lettingIn(R"({"eapMethod":21,"username":"u3"})"))},
            {byHand(1), byHand(2, true), byHand(3), byHand(4)}, {walk, "1 access", "cafe", 2});
}

TEST(ManualConnect, AsksForNothingWhereThereIsNoSuchNetwork) {
    const std::string longName = "0123456789abcdef0123456789abcdef";
    std::string longer;
    while (longer.size() < 288)
        longer += "cafe";
    const Standing failure{"", "0", "-", -1};
    asksFor("a name that is in no list", "hotel", {kCafe}, {byHand(1)}, failure);
    asksFor("33 bytes, however they begin", longName + "!", {open(1, longName, ttls())}, {byHand(1)},
            failure);
    asksFor("289 bytes, which would be 33", longer + "!", {kCafe}, {byHand(1)}, failure);
    asksFor("a name that goes on behind a NUL", {"cafe\0x", 6}, {kCafe}, {byHand(1)}, failure);
    asksFor("no name", "", {kCafe}, {byHand(1)}, {"", "", "-", -1});
    asksFor("a network without realm data", "cafe", {open(1, "cafe", R"("anqp":"never")")}, {byHand(1)},
            {"", "", "-", -1});
}

TEST(ManualConnect, LeavesToTheSystemWhatNoCredentialFits) {
    const std::string elsewhere = ttls("other.example");
    asksFor("a network that it knows", "cafe", {network(1, "cafe", elsewhere + R"(,"osProfile":true)")},
            {byHand(1)}, {"plain cafe", "", "cafe", 0});
    asksFor("one that it doesn't know", "cafe", {network(1, "cafe", elsewhere)}, {byHand(1)},
            {"plain cafe", "", "-", 0});
    asksFor("no hotspot", "cafe", {network(1, "cafe", R"("hs20":false,"osProfile":true,)" + ttls())},
            {byHand(1)}, {"plain cafe", "", "cafe", 0});
    asksFor("the beginning of a name, as it was asked for", "caf", {network(1, "cafe", elsewhere)},
            {byHand(1)}, {"plain caf", "", "-", 0});
}

TEST(ManualConnect, TellsInTheLogHowItWalksThroughTheCredentials) {
    atRest("", {network(1, "cafe", both())}, {byHand(1), byHand(2, true), byHand(3)}, [](Story& story) {
        connect(story, "cafe");
        story.advance(5s);
        story.expectLog(
            {"###Manually connect to a BSS started.###",
             "###We are actually going to connect to HS20 network now.###",
             "Unblocked network with ssid=cafe and mac address=02:aa:00:00:00:01 due to user has manually "
             "connected to it.",
             "Try to connect to HS20 network using next credential.",
             "Selecting credential with id=1",
             "Adding a new EAP-TTLS network profile...",
             "Connection start event: connection initiated by HS20, profile name=cafe",
             "Manual connection started.",
             "Connection failed! profile name=cafe",
             "Manual connection failed, we will try to use next credential.",
             "Try to connect to HS20 network using next credential.",
             "We have tried credential with id=1, skipping...",
             "Selecting credential with id=2",
             "Adding a new EAP-TLS network profile with auth mode=machineOrUser...",
             "connResult=1 after invoking tryConnectHs20BssUsingNextCredential.",
             "Successfully initiated connection to HS20 network=cafe using next credential.",
             "Connection using EAP-TLS with authMode=machineOrUser failed,trying to use EAP-TLS with "
             "authMode=machine.",
             "Manual connection failed, we will try to use next credential.",
             "Selecting credential with id=3",
             "Manual connection failed, we will try to use next credential.",
             "We have tried credential with id=1, skipping...",
             "We have tried credential with id=2, skipping...",
             "We have tried credential with id=3, skipping...",
             "connResult=2 after invoking tryConnectHs20BssUsingNextCredential.",
             "We have tried all credentials, connection failed.",
             "Reason code desc=The user name or password is not correct, or the certificate wa",
             "Send connection result to vexa."});
    });
}

TEST(ManualConnect, TakesTheSameWalkTwice) {
    atRest("", {network(1, "cafe", ttls())}, {byHand(1), byHand(2)}, [](Story& story) {
        for (int i = 0; i < 2; ++i) {
            connect(story, "cafe");
            story.advance(5s);
        }
        expectStanding(story, {.requests = "cafe ttls u1; cafe ttls u2; cafe ttls u1; cafe ttls u2"});
    });
}

TEST(ManualConnect, LeavesTheRetriesOfAutoConnectAlone) {
    atRest("", {network(1, "cafe", ttls())}, {{}}, [](Story& story) {
        story.advance(24s);
        story.forget();
        connect(story, "cafe");
        story.advance(60s);
        expectStanding(story, {.requests = "cafe ttls u1"});
    });
}

TEST(ManualConnect, ARefusedRequestIsToldAtOnce) {
    atRest("", {kCafe}, {byHand(1)}, [](Story& story) {
        story.perform(failing("WlanConnect", 50));
        connect(story, "cafe");
        expectStanding(story, {.requests = "cafe ttls u1 = 50", .outcomes = "0"});
        story.expectLog({"WlanConnect call failed with error code=50.",
                         "Try to connect to HS20 network failed.", "connectBss failed."});
    });
}

TEST(ManualConnect, ANextCredentialThatCanNotStartEndsWithoutAWord) {
    atRest("", {network(1, "cafe", ttls())}, {byHand(1), byHand(2)}, [](Story& story) {
        story.perform(failing("WlanConnect", 50, R"("skip":1)"));
        connect(story, "cafe");
        story.advance(5s);
        expectStanding(story, {.requests = "cafe ttls u1; cafe ttls u2 = 50", .outcomes = ""});
        story.expectLog({"connResult=0 after invoking tryConnectHs20BssUsingNextCredential.",
                         "ERROR: Try to connect to HS20 network using next credential failed."});
    });
}

// The system's own connections carry nothing of this program, whatever their outcome.
TEST(ForeignConnection, IsToldAsASuccessWhateverItsOutcome) {
    for (const bool succeeds : {true, false})
        atRest(succeeds ? "success" : "failure", {kCafe}, {byHand(1)}, [&](Story& story) {
            story.act("osConnect",
                      std::string(R"("ssid":"home","succeeds":)") + (succeeds ? "true" : "false"));
            story.advance(1s);
            expectStanding(story,
                           {.connected = succeeds ? "home" : "-", .eapMethod = 0, .outcomes = "1 no access"});
            story.expectLog(
                {"Connection start event: connection not initiated by HS20, profile name=home",
                 std::string("Connection result not initiated by HS20, profile name=home, result=") +
                     (succeeds ? "Success" : "Failure"),
                 "Send connection result to vexa."});
            story.expect("results without a start",
                         count(story.messages(), "m_bConnectionStartedByOs is not set"), 0);
        });
}

TEST(ForeignConnection, ThatDisplacesOursEndsItAndIsToldApart) {
    atRest("", {kCafe}, {byHand(1)}, [](Story& story) {
        story.act("set", R"("connectMs":2000)");
        connect(story, "cafe");
        story.advance(500ms);
        story.act("osConnect", R"("ssid":"home")");
        story.advance(5s);
        expectStanding(story, {.connected = "home", .eapMethod = 0, .outcomes = "0 no access 1 no access"});
    });
}

// The result of another network whose name begins like the one asked for counts as its own.
TEST(ForeignConnection, ALongerNameWithTheSameBeginningCountsAsOwn) {
    atRest("", {kCafe, network(2, "cafeteria", ttls("x.example"))}, {byHand(1)}, [](Story& story) {
        story.act("set", R"("connectMs":5000)");
        connect(story, "cafe");
        story.advance(1s);
        story.act("connection", R"("code":10,"profileName":"cafe","ssidHex":"636166657465726961")");
        expectStanding(story, {.eapMethod = 2, .outcomes = "1 no access"});
        story.expectLog({"Connection result initiated by HS20, clearing the cache, profile name=cafe.",
                         "Connection succeeded! profile name=cafe"});
    });
}

void endsWithItsLine(const std::string& result, const char* line) {
    atRest(line, {kCafe}, {byHand(1)}, [&](Story& story) {
        story.act("set", R"("connectMs":5000)");
        connect(story, "cafe");
        story.perform(result);
        expectStanding(story, {.eapMethod = 0, .outcomes = ""});
        story.expectLog({line});
    });
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
        for (const std::string& name : asked)
            connect(story, name);
        story.advance(8s);
        expectStanding(story, end);
        story.expectLog(
            {"###Manually connect to a BSS started.###",
             "\tConnection has already been started, maybe by auto connecting thread, we will wait "
             "until the auto connecting completed, either succeed or fail.",
             "Connection result initiated by HS20, clearing the cache, profile name=cafe.",
             "###User manual connecting request pending, we are going to connect now.###",
             "###We are actually going to connect to HS20 network now.###"});
    }) << what;
}

TEST(PendingRequest, RunsWhenTheRunningAttemptHasEndedAndIsAllThatTheClientHears) {
    const char* const all = R"({"eapMethod":21})";
    const Standing inTheHotel{"cafe ttls u1; hotel ttls u2", "1 access", "hotel"};
    waits("after a success", all, {"hotel"}, inTheHotel);
    waits("after a failure", "", {"hotel"}, inTheHotel);
    waits("the last of two", "", {"cafe", "hotel"}, inTheHotel);
    waits("one that is in no list", all, {"motel"}, {"cafe ttls u1", "0", "cafe"});
    waits("the network that is just being joined", all, {"cafe"},
          {"cafe ttls u1; cafe ttls u1", "1 access", "cafe"});
}

}  // namespace
}  // namespace vexa::test
