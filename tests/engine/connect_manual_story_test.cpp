#include <gtest/gtest.h>

#include "engine/connect_story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

const std::string kOpenCafe = network(1, "cafe", ttls() + "," + lettingInAll());

/// A world in which auto-connect has nothing to do: every credential waits for the user's hand.
struct ByHand {
    const char* what;
    std::vector<std::string> networks;
    std::vector<StoredCredential> credentials;
    std::string name;
    std::string requests;
    std::string outcomes;
    std::string connected;
    int eapMethod;
};

StoredCredential byHand(int id, bool isTls = false, const std::string& realm = "a.example") {
    return {.id = id, .realm = realm, .isTls = isTls, .autoConnect = false};
}

const std::vector<ByHand>& manualConnects() {
    static const std::vector<ByHand> all = {
        {"a network that lets the credential in",
         {kOpenCafe},
         {byHand(1)},
         "cafe",
         "cafe ttls u1\n",
         "1 access",
         "cafe",
         2},
        {"every credential in order, with one result for all",
         {network(1, "cafe", both())},
         {byHand(1), byHand(2, true), byHand(3)},
         "cafe",
         "cafe ttls u1\ncafe tls ca2 machineOrUser\ncafe tls ca2 machine\ncafe ttls u3\n",
         "0 no access",
         "-",
         0},
        {"the credential that is let in, behind others",
         {network(1, "cafe", both() + "," + lettingIn(R"({"eapMethod":21,"username":"u3"})"))},
         {byHand(1), byHand(2, true), byHand(3), byHand(4)},
         "cafe",
         "cafe ttls u1\ncafe tls ca2 machineOrUser\ncafe tls ca2 machine\ncafe ttls u3\n",
         "1 access",
         "cafe",
         2},
        {"a name that is in no list", {kOpenCafe}, {byHand(1)}, "hotel", "", "0", "-", -1},
        {"a name of 33 bytes, however it begins",
         {network(1, "0123456789abcdef0123456789abcdef", ttls() + "," + lettingInAll())},
         {byHand(1)},
         "0123456789abcdef0123456789abcdef!",
         "",
         "0",
         "-",
         -1},
        {"a name of 289 bytes, which would be one of 33",
         {kOpenCafe},
         {byHand(1)},
         "cafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafe"
         "cafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafe"
         "cafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafecafe!",
         "",
         "0",
         "-",
         -1},
        {"a name that goes on behind a NUL", {kOpenCafe}, {byHand(1)}, {"cafe\0x", 6}, "", "0", "-", -1},
        {"no name", {kOpenCafe}, {byHand(1)}, "", "", "", "-", -1},
        {"a network without realm data",
         {network(1, "cafe", R"("anqp":"never",)" + lettingInAll())},
         {byHand(1)},
         "cafe",
         "",
         "",
         "-",
         -1},
        {"a network that no credential fits, which the system knows",
         {network(1, "cafe", ttls("other.example") + R"(,"osProfile":true)")},
         {byHand(1)},
         "cafe",
         "plain cafe\n",
         "",
         "cafe",
         0},
        {"a network that no credential fits, which the system doesn't know",
         {network(1, "cafe", ttls("other.example"))},
         {byHand(1)},
         "cafe",
         "plain cafe\n",
         "",
         "-",
         0},
        {"a network that is no hotspot",
         {network(1, "cafe", R"("hs20":false,"osProfile":true,)" + ttls())},
         {byHand(1)},
         "cafe",
         "plain cafe\n",
         "",
         "cafe",
         0},
        {"the beginning of a name goes to the system as it was asked for",
         {network(1, "cafe", ttls("other.example"))},
         {byHand(1)},
         "caf",
         "plain caf\n",
         "",
         "-",
         0},
    };
    return all;
}

TEST(ManualConnect, TriesWhatFitsInOrderAndTellsOneResult) {
    for (const ByHand& c : manualConnects()) {
        const Ending ending = runStory(21, air(c.networks, storing(c.credentials)), [&](World& world) {
            world.advance(2s);
            world.hotspot().events();
            connect(world, c.name);
            std::string text = results(world);
            world.advance(5s);
            text += results(world);
            return requests(world) + "| " + text + " | " + connectedTo(world) + " | " +
                   std::to_string(eapMethod(world));
        });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text,
                  c.requests + "| " + c.outcomes + " | " + c.connected + " | " + std::to_string(c.eapMethod))
            << c.what;
    }
}

TEST(ManualConnect, TellsInTheLogHowItWalksThroughTheCredentials) {
    const std::string scenario =
        air({network(1, "cafe", both())}, storing({byHand(1), byHand(2, true), byHand(3)}));
    const Ending ending = runStory(22, scenario, [](World& world) {
        world.advance(2s);
        connect(world, "cafe");
        world.advance(5s);
        return missingInOrder(
            world,
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
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(ManualConnect, TakesTheSameWalkTwice) {
    const std::string scenario = air({network(1, "cafe", ttls())}, storing({byHand(1), byHand(2)}));
    const Ending ending = runStory(23, scenario, [](World& world) {
        world.advance(2s);
        for (int i = 0; i < 2; ++i) {
            connect(world, "cafe");
            world.advance(5s);
        }
        return requests(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1\ncafe ttls u2\ncafe ttls u1\ncafe ttls u2\n");
}

TEST(ManualConnect, LeavesTheRetriesOfAutoConnectAlone) {
    const std::string scenario = air({network(1, "cafe", ttls())}, storing({{}}));
    const Ending ending = runStory(24, scenario, [](World& world) {
        world.advance(30s);
        world.perform(R"({"do":"clearCalls"})");
        connect(world, "cafe");
        world.advance(60s);
        return requests(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1\n");
}

TEST(ManualConnect, ARefusedRequestIsToldAtOnce) {
    const std::string scenario = air({kOpenCafe}, storing({byHand(1)}));
    const Ending ending = runStory(25, scenario, [](World& world) {
        world.advance(2s);
        world.hotspot().events();
        world.perform(R"({"do":"fail","call":"WlanConnect","error":50})");
        connect(world, "cafe");
        return requests(world) + outcomes(world) + "\n" +
               missingInOrder(world, {"WlanConnect call failed with error code=50.",
                                      "Try to connect to HS20 network failed.", "connectBss failed."});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1 = 50\n0\n");
}

TEST(ManualConnect, ANextCredentialThatCanNotStartEndsWithoutAWord) {
    const std::string scenario = air({network(1, "cafe", ttls())}, storing({byHand(1), byHand(2)}));
    const Ending ending = runStory(26, scenario, [](World& world) {
        world.advance(2s);
        world.hotspot().events();
        world.perform(R"({"do":"fail","call":"WlanConnect","error":50,"skip":1})");
        connect(world, "cafe");
        world.advance(5s);
        return requests(world) + outcomes(world) + "\n" +
               missingInOrder(world, {"connResult=0 after invoking tryConnectHs20BssUsingNextCredential.",
                                      "ERROR: Try to connect to HS20 network using next credential failed."});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe ttls u1\ncafe ttls u2 = 50\n\n");
}

// The system's own connections carry nothing of this program, whatever their outcome.
TEST(ForeignConnection, IsToldAsASuccessWhateverItsOutcome) {
    struct Case {
        const char* succeeds;
        const char* line;
        const char* connected;
    };
    const Case cases[] = {
        {"true", "Connection result not initiated by HS20, profile name=home, result=Success", "home"},
        {"false", "Connection result not initiated by HS20, profile name=home, result=Failure", "-"},
    };
    for (const Case& c : cases) {
        const Ending ending = runStory(27, air({kOpenCafe}, storing({byHand(1)})), [&](World& world) {
            world.advance(2s);
            world.hotspot().events();
            world.perform(std::string(R"({"do":"osConnect","ssid":"home","succeeds":)") + c.succeeds + "}");
            world.advance(1s);
            return outcomes(world) + " " + connectedTo(world) + " " + std::to_string(eapMethod(world)) +
                   missingInOrder(
                       world, {"Connection start event: connection not initiated by HS20, profile name=home",
                               c.line, "Send connection result to vexa."}) +
                   (messagesSince(world, 0).find("m_bConnectionStartedByOs is not set") == std::string::npos
                        ? ""
                        : " without a start");
        });
        EXPECT_TRUE(ending.isOrderly) << c.line << ending.errors;
        EXPECT_EQ(ending.text, std::string("1 no access ") + c.connected + " 0") << c.line;
    }
}

TEST(ForeignConnection, ThatDisplacesOursEndsItAndIsToldApart) {
    const Ending ending =
        runStory(28, air({kOpenCafe}, storing({byHand(1)}) + R"(,"connectMs":2000)"), [](World& world) {
            world.advance(3s);
            world.hotspot().events();
            connect(world, "cafe");
            world.advance(500ms);
            world.perform(R"({"do":"osConnect","ssid":"home"})");
            world.advance(5s);
            return outcomes(world) + " " + connectedTo(world) + " " + std::to_string(eapMethod(world));
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "0 no access 1 no access home 0");
}

// The result of another network whose name begins like the one asked for counts as its own.
TEST(ForeignConnection, ALongerNameWithTheSameBeginningCountsAsOwn) {
    const std::string scenario = air({kOpenCafe, network(2, "cafeteria", ttls("x.example"))},
                                     storing({byHand(1)}) + R"(,"connectMs":5000)");
    const Ending ending = runStory(29, scenario, [](World& world) {
        world.advance(6s);
        world.hotspot().events();
        connect(world, "cafe");
        world.advance(1s);
        world.perform(R"({"do":"connection","code":10,"profileName":"cafe","ssidHex":"636166657465726961"})");
        return outcomes(world) + " " + std::to_string(eapMethod(world)) +
               missingInOrder(world,
                              {"Connection result initiated by HS20, clearing the cache, profile name=cafe.",
                               "Connection succeeded! profile name=cafe"});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1 no access 2");
}

TEST(ConnectionResult, WithoutAProfileOrDataEndsWithItsLineAlone) {
    struct Case {
        const char* what;
        const char* action;
        const char* line;
    };
    const Case cases[] = {
        {"no data", R"({"do":"notify","source":8,"code":10})",
         "ERROR: No wlan connection notification data."},
        {"no name", R"({"do":"connection","code":10,"profileName":"cafe","ssidHex":""})",
         "ERROR: Invalid ssid or ssid length."},
        {"a profile that isn't known",
         R"({"do":"connection","code":10,"profileName":"other","ssidHex":"63616665"})",
         "ERROR: Cannot get profile in profile manager."},
    };
    for (const Case& c : cases) {
        const Ending ending =
            runStory(30, air({kOpenCafe}, storing({byHand(1)}) + R"(,"connectMs":5000)"), [&](World& world) {
                world.advance(6s);
                world.hotspot().events();
                connect(world, "cafe");
                world.perform(c.action);
                return outcomes(world) + std::to_string(eapMethod(world)) + missingInOrder(world, {c.line});
            });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text, "0") << c.what;
    }
}

TEST(PendingRequest, RunsWhenTheRunningAttemptHasEndedAndIsAllThatTheClientHears) {
    struct Case {
        const char* what;
        const char* accepts;
        std::vector<std::string> asked;
        std::string requests;
        std::string outcomes;
        std::string connected;
    };
    const Case cases[] = {
        {"after a success",
         R"({"eapMethod":21})",
         {"hotel"},
         "cafe ttls u1\nhotel ttls u2\n",
         "1 access",
         "hotel"},
        {"after a failure", "", {"hotel"}, "cafe ttls u1\nhotel ttls u2\n", "1 access", "hotel"},
        {"the last of two", "", {"cafe", "hotel"}, "cafe ttls u1\nhotel ttls u2\n", "1 access", "hotel"},
        {"one that is in no list", R"({"eapMethod":21})", {"motel"}, "cafe ttls u1\n", "0", "cafe"},
        {"the network that is just being joined",
         R"({"eapMethod":21})",
         {"cafe"},
         "cafe ttls u1\ncafe ttls u1\n",
         "1 access",
         "cafe"},
    };
    for (const Case& c : cases) {
        const std::string scenario =
            air({network(1, "cafe", ttls() + "," + lettingIn(c.accepts)),
                 network(2, "hotel", ttls("b.example") + "," + lettingInAll())},
                storing({{}, byHand(2, false, "b.example")}) + R"(,"connectMs":1000)");
        const Ending ending = runStory(31, scenario, [&](World& world) {
            world.advance(500ms);
            world.hotspot().events();
            for (const std::string& name : c.asked)
                connect(world, name);
            std::string early = results(world);
            world.advance(8s);
            return early + requests(world) + "| " + results(world) + " | " + connectedTo(world) +
                   missingInOrder(
                       world, {"###Manually connect to a BSS started.###",
                               "\tConnection has already been started, maybe by auto connecting thread, we "
                               "will wait "
                               "until the auto connecting completed, either succeed or fail.",
                               "Connection result initiated by HS20, clearing the cache, profile name=cafe.",
                               "###User manual connecting request pending, we are going to connect now.###",
                               "###We are actually going to connect to HS20 network now.###"});
        });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text, c.requests + "| " + c.outcomes + " | " + c.connected) << c.what;
    }
}

}  // namespace
}  // namespace vexa::test
