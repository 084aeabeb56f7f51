#include <gtest/gtest.h>

#include "engine/StoreStory.h"
#include "engine/connect_story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kSlow = R"(,"connectMs":2000)";

/// What comes over an attempt of auto-connect one second before its result.
struct Midway {
    const char* what;
    bool isLetIn;
    std::vector<std::string> actions;
    std::string command;
    std::string data;
    std::string requests;
    std::string outcomes;
    std::string connected;
};

const std::vector<Midway>& midways() {
    static const std::vector<Midway> all = {
        {"the radio goes off", true, {R"({"do":"radio","software":"off"})"}, "", "", "", "1 no access", "-"},
        {"the radio goes off and on",
         true,
         {R"({"do":"radio","software":"off"})", R"({"do":"radio","software":"on"})"},
         "",
         "",
         "cafe tls ca1 machineOrUser\n",
         "1 no access 1 access",
         "cafe"},
        {"the adapter is pulled: there is nothing to ask for the machine's turn",
         true,
         {R"({"do":"pullAdapter"})"},
         "",
         "",
         "cafe tls ca1 machine = 1168\n",
         "",
         "-"},
        {"the adapter is pulled and comes back",
         true,
         {R"({"do":"pullAdapter"})", R"({"do":"insertAdapter"})"},
         "",
         "",
         "cafe tls ca1 machine = 1168\ncafe tls ca1 machineOrUser\n",
         "1 access",
         "cafe"},
        {"the credential is deleted, and its network lets it in",
         true,
         {},
         "DELETE_CREDENTIAL",
         R"({"Id":1})",
         "",
         "",
         "cafe"},
        {"the credential is deleted, and its network doesn't let it in",
         false,
         {},
         "DELETE_CREDENTIAL",
         R"({"Id":1})",
         "",
         "",
         "-"},
        {"the network goes, but not from the list",
         true,
         {on("hide", 1)},
         "",
         "",
         "cafe tls ca1 machine\n",
         "0 no access",
         "-"},
        {"the network goes from the list too",
         true,
         {on("hide", 1), R"({"do":"reportNetworks"})"},
         "",
         "",
         "cafe tls ca1 machine\n",
         "0 no access",
         "-"},
        {"the adapter arrives once more: the result is the system's now",
         true,
         {R"({"do":"insertAdapter"})"},
         "",
         "",
         "",
         "1 access",
         "cafe"},
    };
    return all;
}

TEST(Midway, EndsAsItShould) {
    for (const Midway& c : midways()) {
        const std::string scenario =
            air({network(1, "cafe", tls() + "," + lettingIn(c.isLetIn ? R"({"eapMethod":13})" : ""))},
                storing({{.isTls = true}}) + kSlow);
        const Ending ending = runStory(61, scenario, [&](World& world) {
            world.advance(1s);
            world.perform(R"({"do":"clearCalls"})");
            world.hotspot().events();
            for (const std::string& action : c.actions)
                world.perform(action);
            if (!c.command.empty()) world.hotspot().send(c.command, c.data);
            world.advance(60s);
            return requests(world) + "| " + results(world) + " | " + connectedTo(world);
        });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text, c.requests + "| " + c.outcomes + " | " + c.connected) << c.what;
    }
}

TEST(Midway, ADeletedCredentialTakesItsProfileWithItAndEndsTheAttemptWithoutAWord) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingInAll())}, storing({{}}) + kSlow);
    const Ending ending = runStory(62, scenario, [](World& world) {
        world.advance(1s);
        world.hotspot().send("DELETE_CREDENTIAL", R"({"Id":1})");
        world.advance(5s);
        return missingInOrder(
                   world, {"Deleting the credential with id=1", "removeAllCredNumRetryEntries for CredId=1",
                           "Cred id=1 deleted, removing profile name=cafe",
                           "Connection result initiated by HS20, clearing the cache, profile "
                           "name=cafe.",
                           "ERROR: Cannot get profile in profile manager."}) +
               std::to_string(eapMethod(world));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "0");
}

// The attempt that runs keeps what it was begun with; the next one builds its profile anew.
TEST(Midway, AnEditedCredentialIsTriedAfreshWithWhatItHoldsNow) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingIn(R"({"eapMethod":21,"username":"right"})"))},
            storing({{}}) + kSlow);
    const Ending ending = runStory(63, scenario, [](World& world) {
        world.advance(1s);
        Json::Value data = parsed(ttlsData("a.example"));
        data["Id"] = 1;
        data["AutoConnect"] = true;
        data["AccessType"] = 1;
        data["Username"] = "right";
        world.hotspot().send("EDIT_CREDENTIAL", data.toStyledString());
        world.advance(30s);
        return requests(world) + connectedTo(world) + std::to_string(eapMethod(world)) +
               missingInOrder(
                   world,
                   {"Updating the credential with id=1", "Cred id=1 deleted, removing profile name=cafe",
                    "ERROR: Cannot get profile in profile manager.", "!!!Creating a new network profile",
                    "Connection succeeded! profile name=cafe"});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1\ncafe ttls right\ncafe2");
}

TEST(RealmUpdate, LetsGoOfTheConnectionAsksAnewAndComesBack) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingInAll())}, storing({{}}) + R"(,"anqpMs":1000)");
    const Ending ending = runStory(64, scenario, [](World& world) {
        world.advance(15s);
        world.perform(R"({"do":"clearCalls"})");
        world.hotspot().events();
        world.hotspot().send("UPDATE_NETWORK_REALM");
        world.advance(0ms);
        std::string text = requests(world) + std::to_string(moduleRequests(world, 3)) +
                           std::to_string(eapMethod(world)) + outcomes(world) + "\n";
        world.advance(30s);
        return text + outcomes(world) + " " + connectedTo(world) +
               missingInOrder(
                   world, {"UI requested to update HS20 network realm.",
                           "Disconnecting from connecting/connected BSS...",
                           "Manually disconnect from a HS20 network.", "Received Wlan disconnected event.",
                           "We are querying the HS20 network ANQP info, wait."});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "disconnect\n10\nnetworks 1 access cafe");
}

TEST(RealmUpdate, OfAConnectionThatIsNoHotspotLetsGoOfItToo) {
    const Ending ending = runStory(65, air({network(1, "cafe", ttls())}), [](World& world) {
        world.perform(R"({"do":"osConnect","ssid":"home"})");
        world.advance(5s);
        world.perform(R"({"do":"clearCalls"})");
        world.hotspot().send("UPDATE_NETWORK_REALM");
        world.advance(0ms);
        return requests(world) + std::to_string(moduleRequests(world, 3)) +
               missingInOrder(world, {"Manually disconnect from a non-HS20 network."});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "disconnect\n1");
}

TEST(HotspotSwitch, OffWhileConnectedLeavesTheNetworkWithoutBlockingIt) {
    const Ending ending = runStory(
        66, air({network(1, "cafe", ttls() + "," + lettingInAll())}, storing({{}})), [](World& world) {
            world.advance(5s);
            world.perform(R"({"do":"clearCalls"})");
            world.hotspot().events();
            switchHs20(world, false);
            std::string text = requests(world) + outcomes(world) + "\n";
            world.advance(30s);
            text += connectedTo(world);
            switchHs20(world, true);
            text += " " + outcomes(world);
            world.advance(5s);
            return text + " " + connectedTo(world) + " " + outcomes(world) +
                   missingInOrder(
                       world,
                       {"Set enable/disable HS20, param=false", "Enter resetAllNumRetries.",
                        "Send all HS20 networks to vexa.",
                        "STA is in connected state when user turns of HS20,trying to disconnect from any "
                        "connected HS20 network.",
                        "Disconnecting from connecting/connected BSS...",
                        "Manually disconnect from a HS20 network.",
                        "HS20 functionality not enabled, wait for user turning it on.",
                        "Enable/disable HS20 event signaled."});
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "disconnect\nnetworks hs20 false networks\n- networks hs20 true cafe 1 access");
}

TEST(HotspotSwitch, OffLeavesAConnectionOfTheSystemAlone) {
    const Ending ending = runStory(67, air({network(1, "cafe", ttls())}, storing({{}})), [](World& world) {
        world.advance(5s);
        world.perform(R"({"do":"osConnect","ssid":"cafe"})");
        world.advance(5s);
        world.perform(R"({"do":"clearCalls"})");
        switchHs20(world, false);
        world.advance(5s);
        return requests(world) + connectedTo(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe");
}

TEST(HotspotSwitch, ToTheValueThatItHasOnlyAnswers) {
    const Ending ending = runStory(
        68, air({network(1, "cafe", ttls() + "," + lettingInAll())}, storing({{}})), [](World& world) {
            world.advance(5s);
            world.perform(R"({"do":"clearCalls"})");
            world.hotspot().events();
            switchHs20(world, true);
            return requests(world) + outcomes(world) + " " + connectedTo(world);
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "hs20 true cafe");
}

TEST(Arrival, OfAnAdapterThatIsThereForgetsWhatWasUnderWay) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingInAll()),
             network(2, "hotel", ttls("b.example") + "," + lettingInAll())},
            storing({{}, {.id = 2, .realm = "b.example", .autoConnect = false}}) + kSlow);
    const Ending ending = runStory(69, scenario, [](World& world) {
        world.advance(1s);
        connect(world, "hotel");
        world.hotspot().events();
        world.perform(R"({"do":"insertAdapter"})");
        world.advance(60s);
        return requests(world) + results(world) + " " + connectedTo(world) + " " +
               count(messagesSince(world, 0), "User manual connecting request pending");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1\n1 access cafe 0 ");
}

}  // namespace
}  // namespace vexa::test
