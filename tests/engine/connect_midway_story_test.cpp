#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kSlow = R"(,"connectMs":2000)";

/// Something comes over an attempt of auto-connect one second before its result.
void comesBetween(const char* what, const Standing& end, const Tale& change, bool isLetIn = true) {
    const std::string network = isLetIn ? open(1, "cafe", tls()) : test::network(1, "cafe", tls());
    EXPECT_STORY(air({network}, storing({{.isTls = true}}) + kSlow), [&](Story& story) {
        story.advance(1s);
        story.forget();
        change(story);
        story.advance(60s);
        expectStanding(story, end);
    }) << what;
}

void deleteCredential(Story& story) {
    story.order("DELETE_CREDENTIAL", R"({"Id":1})");
}

TEST(Midway, EndsAsItShould) {
    comesBetween("the radio goes off", {"", "1 no access", "-"},
                 [](Story& story) { story.perform(kRadioOff); });
    comesBetween("the radio goes off and on", {"cafe tls ca1 machineOrUser", "1 no access 1 access", "cafe"},
                 [](Story& story) {
                     story.perform(kRadioOff);
                     story.perform(kRadioOn);
                 });
    comesBetween("the adapter is pulled: there is nothing to ask for the machine's turn",
                 {"cafe tls ca1 machine = 1168", "", "-"}, [](Story& story) { story.act("pullAdapter"); });
    comesBetween("the adapter is pulled and comes back",
                 {"cafe tls ca1 machine = 1168; cafe tls ca1 machineOrUser", "1 access", "cafe"},
                 [](Story& story) {
                     story.act("pullAdapter");
                     story.act("insertAdapter");
                 });
    comesBetween("the credential is deleted, and its network lets it in", {"", "", "cafe"}, deleteCredential);
    comesBetween("the credential is deleted, and its network doesn't let it in", {"", "", "-"},
                 deleteCredential, false);
    const Standing failure{"cafe tls ca1 machine", "0 no access", "-"};
    comesBetween("the network goes, but not from the list", failure,
                 [](Story& story) { story.perform(on("hide", 1)); });
    comesBetween("the network goes from the list too", failure, [](Story& story) {
        story.perform(on("hide", 1));
        story.perform(kReport);
    });
    comesBetween("the adapter arrives once more: the result is the system's now", {"", "1 access", "cafe"},
                 [](Story& story) { story.act("insertAdapter"); });
}

TEST(Midway, ADeletedCredentialTakesItsProfileWithItAndEndsTheAttemptWithoutAWord) {
    EXPECT_STORY(air({kCafe}, storing({{}}) + kSlow), [](Story& story) {
        story.advance(1s);
        deleteCredential(story);
        story.advance(5s);
        story.expectLog({"Deleting the credential with id=1", "removeAllCredNumRetryEntries for CredId=1",
                         "Cred id=1 deleted, removing profile name=cafe",
                         "Connection result initiated by HS20, clearing the cache, profile name=cafe.",
                         "ERROR: Cannot get profile in profile manager."});
        expectStanding(story, {.eapMethod = 0});
    });
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
        story.expectLog({"Updating the credential with id=1", "Cred id=1 deleted, removing profile name=cafe",
                         "ERROR: Cannot get profile in profile manager.", "!!!Creating a new network profile",
                         "Connection succeeded! profile name=cafe"});
    });
}

TEST(Midway, AnArrivalOfAnAdapterThatIsThereForgetsWhatWasUnderWay) {
    const std::string scenario =
        air({kCafe, kHotel}, storing({{}, {.id = 2, .realm = "b.example", .autoConnect = false}}) + kSlow);
    EXPECT_STORY(scenario, [](Story& story) {
        story.advance(1s);
        connect(story, "hotel");
        story.hotspot().events();
        story.act("insertAdapter");
        story.advance(60s);
        expectStanding(story, {"cafe ttls u1", "1 access", "cafe"});
        story.expect("pending requests", count(story.messages(), "User manual connecting request pending"),
                     0);
    });
}

/// A story about a realm update or the hotspot switch, which begins when all has come to rest.
void atRest(const std::string& scenario, const Tale& tale) {
    EXPECT_STORY(scenario, [&](Story& story) {
        story.advance(15s);
        story.forget();
        tale(story);
    });
}

TEST(RealmUpdate, LetsGoOfTheConnectionAsksAnewAndComesBack) {
    atRest(air({kCafe}, storing({{}}) + R"(,"anqpMs":1000)"), [](Story& story) {
        story.order("UPDATE_NETWORK_REALM");
        expectStanding(story, {.requests = "disconnect", .eapMethod = 0, .outcomes = ""});
        story.expect("queries", moduleRequests(story, 3), 1);
        story.advance(30s);
        expectStanding(story, {.connected = "cafe", .outcomes = "networks 1 access"});
        story.expectLog({"UI requested to update HS20 network realm.",
                         "Disconnecting from connecting/connected BSS...",
                         "Manually disconnect from a HS20 network.", "Received Wlan disconnected event.",
                         "We are querying the HS20 network ANQP info, wait."});
    });
}

TEST(RealmUpdate, OfAConnectionThatIsNoHotspotLetsGoOfItToo) {
    atRest(air({network(1, "cafe", ttls())}), [](Story& story) {
        story.act("osConnect", R"("ssid":"home")");
        story.advance(5s);
        story.order("UPDATE_NETWORK_REALM");
        expectStanding(story, {.requests = "disconnect"});
        story.expect("queries", moduleRequests(story, 3), 1);
        story.expectLog({"Manually disconnect from a non-HS20 network."});
    });
}

TEST(RealmUpdate, AsksAtOnceWhileNothingIsConnected) {
    atRest(air({network(1, "A", R"("anqp":"onQuery",)" + ttls())}), [](Story& story) {
        story.order("UPDATE_NETWORK_REALM");
        story.expect("queries", moduleRequests(story, 3), 1);
        story.expect("heard before the answer", heard(story), "");
        story.advance(200ms);
        story.expect("heard", heard(story), "networks A[a.example TTLS]");
    });
}

TEST(RealmUpdate, DoesNothingWithoutAnAdapter) {
    atRest(air({network(1, "A")}), [](Story& story) {
        story.act("pullAdapter");
        story.forget();
        story.order("UPDATE_NETWORK_REALM");
        story.expect("log", story.messages(), "UI requested to update HS20 network realm.\n");
        story.expect("calls", story.perform(R"({"query":"calls"})").size(), 0U);
    });
}

TEST(HotspotSwitch, OffWhileConnectedLeavesTheNetworkWithoutBlockingIt) {
    atRest(air({kCafe}, storing({{}})), [](Story& story) {
        switchHs20(story, false);
        expectStanding(story, {.requests = "disconnect", .outcomes = "networks hs20 false networks"});
        story.advance(30s);
        expectStanding(story, {.connected = "-"});
        switchHs20(story, true);
        expectStanding(story, {.outcomes = "networks hs20 true"});
        story.advance(5s);
        expectStanding(story, {.connected = "cafe", .outcomes = "1 access"});
        story.expectLog({"Set enable/disable HS20, param=false", "Enter resetAllNumRetries.",
                         "Send all HS20 networks to vexa.",
                         "STA is in connected state when user turns of HS20,trying to disconnect from any "
                         "connected HS20 network.",
                         "Disconnecting from connecting/connected BSS...",
                         "Manually disconnect from a HS20 network.",
                         "HS20 functionality not enabled, wait for user turning it on.",
                         "Enable/disable HS20 event signaled."});
    });
}

TEST(HotspotSwitch, OffLeavesAConnectionOfTheSystemAlone) {
    atRest(air({network(1, "cafe", ttls())}, storing({{}})), [](Story& story) {
        story.act("osConnect", R"("ssid":"cafe")");
        story.advance(5s);
        story.forget();
        switchHs20(story, false);
        story.advance(5s);
        expectStanding(story, {.requests = "", .connected = "cafe"});
    });
}

TEST(HotspotSwitch, ToTheValueThatItHasOnlyAnswers) {
    atRest(air({kCafe}, storing({{}})), [](Story& story) {
        switchHs20(story, true);
        expectStanding(story, {.requests = "", .connected = "cafe", .outcomes = "hs20 true"});
    });
}

}  // namespace
}  // namespace vexa::test
