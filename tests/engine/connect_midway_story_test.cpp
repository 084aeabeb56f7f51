#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

// The thread sleeps for ten seconds when it has learnt of the radio, at the start too.
constexpr auto kBehindStart = 15s;

constexpr const char* kSlow = R"(,"connectMs":2000)";

const std::string kOther = network(2, "other", ttls("other.example"));

const std::string kDeletion = sending("DELETE_CREDENTIAL", R"({"Id":1})");

/// Something comes over an attempt of auto-connect one second before its result.
void comesBetween(const std::string& what, const Standing& end, const std::vector<std::string>& deeds,
                  const std::string& cafe = open(1, "cafe", tls())) {
    EXPECT_STORY(air({cafe, kOther}, storing({{.isTls = true}}) + kSlow), [&](Story& story) {
        settle(story, 1s, deeds);
        story.advance(60s);
        expectStanding(story, end);
    }) << what;
}

TEST(Midway, EndsAsItShould) {
    const std::string pull = doing("pullAdapter");
    const std::string insert = doing("insertAdapter");
    comesBetween("the radio goes off", {"", "1 no access", "-"}, {kRadioOff});
    comesBetween("the radio goes off and on", {"cafe tls ca1 machineOrUser", "1 no access 1 access", "cafe"},
                 {kRadioOff, kRadioOn});
    comesBetween("the adapter is pulled: there is nothing to ask for the machine's turn",
                 {"cafe tls ca1 machine = 1168", "", "-"}, {pull});
    comesBetween("the adapter is pulled and comes back",
                 {"cafe tls ca1 machine = 1168; cafe tls ca1 machineOrUser", "1 access", "cafe"},
                 {pull, insert});
    comesBetween("the credential is deleted, and its network lets it in", {"", "", "cafe"}, {kDeletion});
    comesBetween("the credential is deleted, and its network doesn't let it in", {"", "", "-"}, {kDeletion},
                 network(1, "cafe", tls()));
    comesBetween("the network goes, but not from the list", {"cafe tls ca1 machine", "0 no access", "-"},
                 {on("hide", 1)});
    comesBetween("the network goes from the list too", {"", "", "-", 0}, {on("hide", 1), kReport});
    comesBetween("the network goes from the list alone", {"", "", "cafe", 0},
                 {on("setNetwork", 1, R"("reported":false)"), kReport});
    comesBetween("the adapter arrives again: the result is the system's", {"", "1 access", "cafe"}, {insert});
}

STORY(Midway, AWalkByHandEndsWhereItsNetworkLeavesTheList,
      air({network(1, "cafe", ttls()), kOther},
          storing({{.autoConnect = false}, {.id = 2, .autoConnect = false}}) + kSlow)) {
    story.play({connecting("cafe"), passing(1s), on("hide", 1), kReport, passing(5s)});
    expectStanding(story, {"cafe ttls u1", "0 no access", "-", 0});
    story.expectLog("connResult=0 after invoking tryConnectHs20BssUsingNextCredential.",
                    "WARNING: The network we were connecting is no longer available, a naughty network!");
}

STORY(Midway, ADeletedCredentialTakesItsProfileWithItAndEndsTheAttemptWithoutAWord,
      air({kCafe}, storing({{}}) + kSlow)) {
    story.play({passing(1s), kDeletion, passing(5s)});
    story.expectLog("Deleting the credential with id=1", "removeAllCredNumRetryEntries for CredId=1",
                    "Cred id=1 deleted, removing profile name=cafe",
                    "Connection result initiated by HS20, clearing the cache, profile name=cafe.",
                    "ERROR: Cannot get profile in profile manager.");
    expectStanding(story, {.eapMethod = 0});
}

// The attempt that runs keeps what it was begun with; the next one builds its profile anew.
TEST(Midway, AnEditedCredentialIsTriedAfreshWithWhatItHoldsNow) {
    const std::string letIn = lettingIn(R"({"eapMethod":21,"username":"right"})");
    EXPECT_STORY(air({network(1, "cafe", ttls() + "," + letIn)}, storing({{}}) + kSlow), [](Story& story) {
        story.advance(1s);
        story.order("EDIT_CREDENTIAL",
                    ttlsData("a.example", R"("Id":1,"AutoConnect":true,"Username":"right")"));
        story.advance(30s);
        expectStanding(story,
                       {.requests = "cafe ttls u1; cafe ttls right", .connected = "cafe", .eapMethod = 2});
        story.expectLog("Updating the credential with id=1", "Cred id=1 deleted, removing profile name=cafe",
                        "ERROR: Cannot get profile in profile manager.", "!!!Creating a new network profile",
                        "Connection succeeded! profile name=cafe");
    });
}

STORY(Midway, AnArrivalOfAnAdapterThatIsThereForgetsWhatWasUnderWay,
      air({kCafe, kHotel}, storing({{}, {.id = 2, .realm = "b.example", .autoConnect = false}}) + kSlow)) {
    story.play({passing(1s), connecting("hotel")});
    story.hotspot().events();
    story.play({doing("insertAdapter"), passing(60s)});
    expectStanding(story, {"cafe ttls u1", "1 access", "cafe"});
    story.expectOfLog("pending requests", count(story.messages(), "User manual connecting request pending"),
                      0);
}

STORY(RealmUpdate, LetsGoOfTheConnectionAsksAnewAndComesBack,
      air({kCafe}, storing({{}}) + R"(,"anqpMs":1000)")) {
    settle(story, kBehindStart);
    story.order("UPDATE_NETWORK_REALM");
    expectStanding(story, {.requests = "disconnect", .eapMethod = 0, .outcomes = ""});
    story.expect("queries", moduleRequests(story, 3), 1);
    story.advance(30s);
    expectStanding(story, {.connected = "cafe", .outcomes = "networks 1 access"});
    story.expectLog("UI requested to update HS20 network realm.",
                    "Disconnecting from connecting/connected BSS...",
                    "Manually disconnect from a HS20 network.", "Received Wlan disconnected event.",
                    "We are querying the HS20 network ANQP info, wait.");
}

STORY(RealmUpdate, OfAConnectionThatIsNoHotspotLetsGoOfItToo, air({network(1, "cafe", ttls())})) {
    settle(story, kBehindStart, {doing("osConnect", R"("ssid":"home")"), passing(5s)});
    story.order("UPDATE_NETWORK_REALM");
    expectStanding(story, {.requests = "disconnect"});
    story.expect("queries", moduleRequests(story, 3), 1);
    story.expectLog("Manually disconnect from a non-HS20 network.");
}

STORY(RealmUpdate, AsksAtOnceWhileNothingIsConnected,
      air({network(1, "A", R"("anqp":"onQuery",)" + ttls())})) {
    settle(story, kBehindStart);
    story.order("UPDATE_NETWORK_REALM");
    story.expect("queries", moduleRequests(story, 3), 1);
    story.expect("heard before the answer", heard(story), "");
    story.advance(200ms);
    story.expect("heard", heard(story), "networks A[a.example TTLS]");
}

// Nor while the adapter counts as out, because it couldn't be looked for.
TEST(RealmUpdate, DoesNothingWithoutAnAdapter) {
    const std::string removal = doing("notify", R"("source":8,"code":14)");
    for (const auto& deeds : {std::vector{doing("pullAdapter")}, {failing("WlanEnumInterfaces", 8), removal}})
        EXPECT_STORY(air({network(1, "A")}), [&](Story& story) {
            settle(story, kBehindStart, deeds);
            story.forget();
            story.order("UPDATE_NETWORK_REALM");
            story.expectOfLog("log", story.messages(), "UI requested to update HS20 network realm.\n");
            story.expect("calls", story.perform(R"({"query":"calls"})").size(), 0U);
        });
}

STORY(HotspotSwitch, OffWhileConnectedLeavesTheNetworkWithoutBlockingIt, air({kCafe}, storing({{}}))) {
    settle(story, kBehindStart, {kHs20Off});
    expectStanding(story, {.requests = "disconnect", .outcomes = "networks hs20 false networks"});
    story.advance(30s);
    expectStanding(story, {.connected = "-"});
    story.play({kHs20On});
    expectStanding(story, {.outcomes = "networks hs20 true"});
    story.advance(5s);
    expectStanding(story, {.connected = "cafe", .outcomes = "1 access"});
    story.expectLog("Set enable/disable HS20, param=false", "Enter resetAllNumRetries.",
                    "Send all HS20 networks to vexa.",
                    "STA is in connected state when user turns of HS20,trying to disconnect from any "
                    "connected HS20 network.",
                    "Disconnecting from connecting/connected BSS...",
                    "Manually disconnect from a HS20 network.",
                    "HS20 functionality not enabled, wait for user turning it on.",
                    "Enable/disable HS20 event signaled.");
}

STORY(HotspotSwitch, OffLeavesAConnectionOfTheSystemAlone, air({network(1, "cafe", ttls())}, storing({{}}))) {
    settle(story, kBehindStart, {doing("osConnect", R"("ssid":"cafe")"), passing(5s)});
    story.forget();
    story.play({kHs20Off, passing(5s)});
    expectStanding(story, {.requests = "", .connected = "cafe"});
}

STORY(HotspotSwitch, ToTheValueThatItHasOnlyAnswers, air({kCafe}, storing({{}}))) {
    settle(story, kBehindStart, {kHs20On});
    expectStanding(story, {.requests = "", .connected = "cafe", .outcomes = "hs20 true"});
}

}  // namespace
}  // namespace vexa::test
