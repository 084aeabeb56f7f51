#include <gtest/gtest.h>

#include "engine/connect_story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

// The thread sleeps for ten seconds when it has learnt of the radio, at the start too.
constexpr auto kBehindStart = 15s;

const std::string kBothFail =
    "cafe tls ca1 machineOrUser\n"
    "cafe tls ca1 machine\n";

struct AutoConnect {
    const char* what;
    std::vector<std::string> networks;
    std::vector<StoredCredential> credentials;
    std::string requests;
    std::string outcomes;
    std::string connected;
    int eapMethod;
};

const std::vector<AutoConnect>& autoConnects() {
    const StoredCredential ttls1;
    const StoredCredential tls1{.isTls = true};
    static const std::vector<AutoConnect> all = {
        {"a password that is let in",
         {network(1, "cafe", ttls() + "," + lettingInAll())},
         {ttls1},
         "cafe ttls u1\n",
         "1 access",
         "cafe",
         2},
        {"a certificate that is let in",
         {network(1, "cafe", tls() + "," + lettingInAll())},
         {tls1},
         "cafe tls ca1 machineOrUser\n",
         "1 access",
         "cafe",
         1},
        {"a certificate of the machine alone, with one result for both attempts",
         {network(1, "cafe", tls() + "," + lettingIn(R"({"eapMethod":13,"authMode":"machine"})"))},
         {tls1},
         kBothFail,
         "1 access",
         "cafe",
         1},
        {"a certificate that nobody wants is tried once each way",
         {network(1, "cafe", tls())},
         {tls1},
         kBothFail,
         "0 no access",
         "-",
         0},
        {"a password that nobody wants is tried twice",
         {network(1, "cafe", ttls())},
         {ttls1},
         "cafe ttls u1\ncafe ttls u1\n",
         "0 no access 0 no access",
         "-",
         0},
        {"the next credential when the first has no attempts left",
         {network(1, "cafe", both() + "," + lettingIn(R"({"eapMethod":21,"username":"u2"})"))},
         {tls1, {.id = 2}},
         kBothFail + "cafe ttls u2\n",
         "0 no access 1 access",
         "cafe",
         2},
        {"a second password of the same method goes with the profile that is there",
         {network(1, "cafe", ttls() + "," + lettingIn(R"({"eapMethod":21,"username":"u2"})"))},
         {ttls1, {.id = 2}},
         "cafe ttls u1\ncafe ttls u1\ncafe ttls u1\ncafe ttls u1\n",
         "0 no access 0 no access 0 no access 0 no access",
         "-",
         0},
        {"the network of the better credential, though it comes later",
         {network(1, "first", ttls("b.example") + "," + lettingInAll()),
          network(2, "second", ttls() + "," + lettingInAll())},
         {ttls1, {.id = 2, .realm = "b.example"}},
         "second ttls u1\n",
         "1 access",
         "second",
         2},
        {"the earlier network of two for one credential",
         {network(1, "first", ttls() + "," + lettingInAll()),
          network(2, "second", ttls() + "," + lettingInAll())},
         {ttls1},
         "first ttls u1\n",
         "1 access",
         "first",
         2},
        {"the other network when the first is exhausted, with a count of its own",
         {network(1, "first", ttls()), network(2, "second", ttls() + "," + lettingInAll())},
         {ttls1},
         "first ttls u1\nfirst ttls u1\nsecond ttls u1\n",
         "0 no access 0 no access 1 access",
         "second",
         2},
        {"nothing for a credential that is for the user's hand alone",
         {network(1, "cafe", ttls() + "," + lettingInAll())},
         {{.autoConnect = false}},
         "",
         "",
         "-",
         -1},
        {"the credential behind one that is for the user's hand alone",
         {network(1, "cafe", ttls() + "," + lettingInAll())},
         {{.autoConnect = false}, {.id = 2}},
         "cafe ttls u2\n",
         "1 access",
         "cafe",
         2},
        {"nothing for a realm that the network doesn't know",
         {network(1, "cafe", ttls("other.example") + "," + lettingInAll())},
         {ttls1},
         "",
         "",
         "-",
         -1},
        {"a name of 32 bytes, counted like any other",
         {network(1, "0123456789abcdef0123456789ABCDEF", ttls())},
         {ttls1},
         "0123456789abcdef0123456789ABCDEF ttls u1\n0123456789abcdef0123456789ABCDEF ttls u1\n",
         "0 no access 0 no access",
         "-",
         0},
        {"a name that XML can not hold costs its attempts",
         {network(1, "a&b", ttls() + "," + lettingInAll())},
         {ttls1},
         "a&b ttls u1 = 1206\na&b ttls u1 = 1206\n",
         "",
         "-",
         -1},
    };
    return all;
}

TEST(AutoConnect, JoinsWhatItMayAndGivesUpAfterItsAttempts) {
    for (const AutoConnect& c : autoConnects()) {
        const Ending ending = runStory(11, air(c.networks, storing(c.credentials)), [](World& world) {
            world.advance(60s);
            return requests(world) + "| " + results(world) + " | " + connectedTo(world) + " | " +
                   std::to_string(eapMethod(world));
        });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text,
                  c.requests + "| " + c.outcomes + " | " + c.connected + " | " + std::to_string(c.eapMethod))
            << c.what;
    }
}

// What the log tells while it joins: the story of one success, line for line in its order.
TEST(AutoConnect, TellsInTheLogWhyItChoseWhatItChose) {
    const std::string scenario = air({network(1, "first", ttls("b.example") + "," + lettingInAll()),
                                      network(2, "second", ttls() + "," + lettingInAll())},
                                     storing({{}, {.id = 2, .realm = "b.example"}}));
    const Ending ending = runStory(12, scenario, [](World& world) {
        world.advance(5s);
        return missingInOrder(
            world,
            {">>>> Enter connectNetwork",
             "\tIterate over all BSS list to find if any matches with any stored credential.",
             "Enter findBestMatchBssAndCredential...",
             "------------------------------------------------------------------",
             "\t[1] Checking HS20 network with ssid=####first#### and bssid=02:aa:00:00:00:01",
             "\tFound 1 credentials",
             "\tChecking found credentials...",
             "\tChecking credential with id=2 name=name2, realm=b.example, priority=2",
             "\tSelected cred id=2",
             "\tSelecting credential with id=2 name=name2 and bss with ssid=first",
             "\tHome SP ssid=first, bHomeSP=0",
             "\t[2] Checking HS20 network with ssid=####second#### and bssid=02:aa:00:00:00:02",
             "\tSelected cred id=1",
             "\tSelecting credential with id=1 name=name1 and bss with ssid=second\tReplacing credential "
             "with id=2 name=name2 and ssid=first",
             "\tHome SP ssid=second, bHomeSP=0",
             "!!!Found a credential with id=1 for network with ssid=second",
             "!!!Creating a new network profile",
             "Adding a new EAP-TTLS network profile...",
             "\tUsername=u1, password=p1",
             "Not found cred2ssid entry: credId=1, ssid=second, adding a new entry with numRetries=0",
             "Going to connect to network with ssid=second",
             "Increase retry numbers for cred id=1, ssid=second",
             "\tIncrease cred2ssid num retries: credId=1, ssid=second, numRetries=0",
             "Connect to network second",
             "Network profile for ssid=second",
             "\tInterworking: Connect with 02:aa:00:00:00:02",
             "Connection start event: connection initiated by HS20, profile name=second",
             "Connection result initiated by HS20, clearing the cache, profile name=second.",
             "Connection succeeded! profile name=second",
             "Supplicant state changed from Initialized to Connected",
             ">>>>Clear cred num retries on conn success: profileName=second",
             "Reason code desc=The operation was successful.",
             "Send connection result to vexa.",
             "Send connection status to vexa"});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AutoConnect, TellsInTheLogHowItGaveUp) {
    const std::string scenario = air({network(1, "cafe", both())}, storing({{.isTls = true}, {.id = 2}}));
    const Ending ending = runStory(13, scenario, [](World& world) {
        world.advance(60s);
        return missingInOrder(
            world, {"!!!Creating a new network profile",
                    "Adding a new EAP-TLS network profile with auth mode=machineOrUser...",
                    "Connection failed! profile name=cafe",
                    "Connection using EAP-TLS with authMode=machineOrUser failed,trying to use EAP-TLS with "
                    "authMode=machine.",
                    "Adding a new EAP-TLS network profile with auth mode=machine...",
                    "Connection failed! profile name=cafe",
                    "Reason code desc=The user name or password is not correct, or the certificate wa",
                    "\tRetry number exceeds maximum retry limit, skip this credential id=1, ssid=cafe",
                    "\tSelected cred id=2",
                    "Profile exists for ssid=cafe",
                    "\tEAP method doesn't matches, create new profile.",
                    "!!!Creating a new network profile",
                    "Adding a new EAP-TTLS network profile...",
                    "Connection failed! profile name=cafe",
                    "\tSelected cred id=2",
                    "\tEAP method matches, don't create new profile.",
                    "\tIncrease cred2ssid num retries: credId=2, ssid=cafe, numRetries=1",
                    "Connection failed! profile name=cafe",
                    "\tRetry number exceeds maximum retry limit, skip this credential id=1, ssid=cafe",
                    "\tRetry number exceeds maximum retry limit, skip this credential id=2, ssid=cafe",
                    "\t No credential found.",
                    "No matching network was found based on configured credentials."});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AutoConnect, SwitchedOffInTheFileItBuildsTheProfileOnceAndConnectsNothing) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingInAll())}, storing({{}}, {.autoConnect = false}));
    const Ending ending = runStory(14, scenario, [](World& world) {
        world.advance(60s);
        const std::string log = messagesSince(world, 0);
        const bool isBuiltOnce = log.find("!!!Creating") == log.rfind("!!!Creating");
        return requests(world) +
               missingInOrder(
                   world, {"!!!Creating a new network profile", "connectNetwork returns with op succeeded.",
                           "\tEAP method matches, don't create new profile.",
                           "connectNetwork returns with op succeeded."}) +
               (isBuiltOnce ? "once" : "more than once") +
               (log.find("Increase retry") == std::string::npos ? "" : ", counted");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "once");
}

TEST(AutoConnect, ComesBackAfterADropAndAfterTheNetworkWasAway) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingInAll()), network(2, "other", ttls("other.example"))},
            storing({{}}));
    const Ending ending = runStory(15, scenario, [](World& world) {
        world.advance(kBehindStart);
        std::string text = connectedTo(world);
        world.perform(R"({"do":"dropConnection"})");
        text += std::to_string(eapMethod(world));
        world.advance(1s);
        text += connectedTo(world);
        world.perform(on("hide", 1));
        world.perform(R"({"do":"reportNetworks"})");
        world.advance(30s);
        text += connectedTo(world);
        world.perform(on("show", 1));
        world.perform(R"({"do":"reportNetworks"})");
        world.advance(30s);
        return text + connectedTo(world) + std::to_string(eapMethod(world));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe0cafe-cafe2");
}

// What gives a credential its attempts back.
TEST(AutoConnect, TriesAgainWhenSomethingHasChanged) {
    struct Change {
        const char* what;
        std::vector<std::string> actions;
        std::string command;
        std::string data;
        int attempts;
    };
    const Change changes[] = {
        {"nothing", {}, "", "", 0},
        {"the session", {R"({"do":"sessionChange","eventType":8,"sessionId":1})"}, "", "", 2},
        {"the radio", {R"({"do":"radio","software":"off"})", R"({"do":"radio","software":"on"})"}, "", "", 2},
        {"the credential",
         {},
         "EDIT_CREDENTIAL",
         R"({"Id":1,"CredentialEapMethod":2,"Type":1,"RealName":"a.example","AccessType":1,"AutoConnect":true,"Username":"u1","Password":"new"})",
         2},
        {"the adapter", {R"({"do":"pullAdapter"})", R"({"do":"insertAdapter"})"}, "", "", 2},
        {"an arrival of what is there", {R"({"do":"insertAdapter"})"}, "", "", 2},
        {"a report that lacks the network, and one that has it",
         {on("hide", 1), R"({"do":"reportNetworks"})", on("show", 1), R"({"do":"reportNetworks"})"},
         "",
         "",
         2},
        {"a report of the same network", {R"({"do":"reportNetworks"})"}, "", "", 0},
        {"an arrival of a credential elsewhere",
         {},
         "ADD_CREDENTIAL",
         R"({"CredentialEapMethod":2,"Type":1,"RealName":"b.example","AccessType":1,"AutoConnect":true,"Username":"u1","Password":"new"})",
         0},
    };
    for (const Change& change : changes) {
        const std::string scenario =
            air({network(1, "cafe", ttls()), network(2, "other", ttls("other.example"))}, storing({{}}));
        const Ending ending = runStory(16, scenario, [&](World& world) {
            world.advance(60s);
            world.perform(R"({"do":"clearCalls"})");
            for (const std::string& action : change.actions)
                world.perform(action);
            if (!change.command.empty()) world.hotspot().send(change.command, change.data);
            world.advance(60s);
            return requests(world);
        });
        EXPECT_TRUE(ending.isOrderly) << change.what << ending.errors;
        std::string expected;
        for (int i = 0; i < change.attempts; ++i)
            expected += "cafe ttls u1\n";
        EXPECT_EQ(ending.text, expected) << change.what;
    }
}

TEST(AutoConnect, ARefusedRequestCostsAnAttempt) {
    const std::string scenario =
        air({network(1, "cafe", ttls() + "," + lettingInAll())},
            storing({{}}) + R"(,"timeline":[{"atMs":0,"do":"fail","call":"WlanConnect","error":50}])");
    const Ending ending = runStory(17, scenario, [](World& world) {
        world.advance(60s);
        return requests(world) +
               missingInOrder(world, {"WlanConnect call failed with error code=50.",
                                      "ERROR: Connect to network failed.", "connectNetwork returns error.",
                                      "\tIncrease cred2ssid num retries: credId=1, ssid=cafe, numRetries=1",
                                      "Connection succeeded! profile name=cafe"});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1 = 50\ncafe ttls u1\n");
}

TEST(AutoConnect, SaysThatThereIsNoAccessWithoutANameServer) {
    const std::string scenario = air({network(1, "cafe", ttls() + "," + lettingInAll())},
                                     storing({{}}) + R"(,"adapters":[{"dns":[]}])");
    const Ending ending = runStory(18, scenario, [](World& world) {
        world.advance(5s);
        return results(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1 no access");
}

}  // namespace
}  // namespace vexa::test
