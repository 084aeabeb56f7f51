#include <gtest/gtest.h>

#include "engine/StoreStory.h"
#include "engine/connect_story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;
using std::chrono::milliseconds;

const std::string kCafe = network(1, "cafe", ttls() + "," + lettingInAll());
const std::string kHotel = network(2, "hotel", ttls("b.example") + "," + lettingInAll());
constexpr const char* kUserLeft = R"({"do":"userDisconnect","ssid":"cafe"})";
constexpr const char* kBlocks = "We are going to block network with ssid=cafe";

// How often a line stands in the log.
int lines(World& world, const std::string& line) {
    const std::string log = "\n" + messagesSince(world, 0);
    int found = 0;
    for (std::size_t at = 0; (at = log.find("\n" + line + "\n", at)) != std::string::npos; ++at)
        ++found;
    return found;
}

TEST(Disconnect, KeepsAutoConnectAwayUntilTheUserAsksAgain) {
    const Ending ending = runStory(41, air({kCafe}, storing({{}})), [](World& world) {
        world.advance(5s);
        world.perform(R"({"do":"clearCalls"})");
        world.hotspot().events();
        disconnect(world, "cafe");
        std::string text = requests(world) + outcomes(world) + std::to_string(eapMethod(world));
        world.advance(120s);
        text += requests(world) + connectedTo(world);
        text += missingInOrder(
            world,
            {"Disconnecting from connecting/connected BSS...", "Manually disconnect from a HS20 network.",
             kBlocks,
             "The network with ssid=cafe and mac address=02:aa:00:00:00:01 has been blocked due to user "
             "manually disconnect from this network.",
             "Received Wlan disconnected event.", "Reason code desc=The user disconnected.",
             "This network has been disconnected by user, skip auto connecting to ssid=cafe",
             "No matching network was found based on configured credentials."});
        connect(world, "cafe");
        world.advance(5s);
        text += connectedTo(world);
        world.perform(R"({"do":"dropConnection"})");
        world.advance(5s);
        return text + connectedTo(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "disconnect\nnetworks0disconnect\n-cafecafe");
}

TEST(Disconnect, OfWhatIsNotConnectedChangesNothing) {
    struct Case {
        std::string name;
        const char* line;
    };
    const Case cases[] = {
        {{"cafe\0x", 6}, "ERROR: Connected ssid=cafe while requesting disconnect from ssid=cafe"},
        {"hotel", "ERROR: Connected ssid=cafe while requesting disconnect from ssid=hotel"},
        {"caf", "ERROR: Connected ssid=cafe while requesting disconnect from ssid=caf"},
    };
    for (const Case& c : cases) {
        const Ending ending = runStory(42, air({kCafe, kHotel}, storing({{}})), [&](World& world) {
            world.advance(5s);
            world.perform(R"({"do":"clearCalls"})");
            disconnect(world, c.name);
            world.advance(5s);
            return requests(world) + connectedTo(world) + missingInOrder(world, {c.line});
        });
        EXPECT_TRUE(ending.isOrderly) << c.name << ending.errors;
        EXPECT_EQ(ending.text, "cafe") << c.name;
    }
}

TEST(Disconnect, WithNothingConnectedSaysSo) {
    const Ending ending = runStory(43, air({kCafe}), [](World& world) {
        world.advance(5s);
        disconnect(world, "cafe");
        return requests(world) + missingInOrder(world, {"ERROR: Cannot get connected BSS."});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

// One result, and no next step: neither for the machine nor with another credential.
TEST(Disconnect, InTheMiddleOfAnAttemptEndsItForGood) {
    struct Case {
        const char* what;
        std::vector<StoredCredential> credentials;
        bool isManual;
        std::string requests;
    };
    const Case cases[] = {
        {"auto-connect with a certificate", {{.isTls = true}}, false, "cafe tls ca1 machineOrUser\n"},
        {"auto-connect with a password", {{}}, false, "cafe ttls u1\n"},
        {"by hand with two",
         {{.autoConnect = false}, {.id = 2, .autoConnect = false}},
         true,
         "cafe ttls u1\n"},
    };
    for (const Case& c : cases) {
        const std::string scenario = air({network(1, "cafe", both() + "," + lettingInAll())},
                                         storing(c.credentials) + R"(,"connectMs":2000)");
        const Ending ending = runStory(44, scenario, [&](World& world) {
            world.advance(1s);
            if (c.isManual) {
                connect(world, "cafe");
                world.advance(1s);
            }
            world.hotspot().events();
            disconnect(world, "cafe");
            world.advance(60s);
            return requests(world) + results(world) + " " + connectedTo(world) + " " +
                   std::to_string(eapMethod(world)) +
                   missingInOrder(world, {"Connection failed! profile name=cafe",
                                          "Reason code desc=The connection was cancelled."});
        });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text, c.requests + "disconnect\n0 no access - 0") << c.what;
    }
}

// The flag that says so is gone with the first result: the next attempt fails as any other.
TEST(Disconnect, IsForgottenWithTheNextResult) {
    const std::string scenario =
        air({network(1, "cafe", tls())},
            storing({{.isTls = true, .autoConnect = false}}) + R"(,"connectMs":2000)");
    const Ending ending = runStory(45, scenario, [](World& world) {
        world.advance(1s);
        connect(world, "cafe");
        world.advance(1s);
        disconnect(world, "cafe");
        world.advance(5s);
        world.perform(R"({"do":"clearCalls"})");
        connect(world, "cafe");
        world.advance(10s);
        return requests(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe tls ca1 machineOrUser\ncafe tls ca1 machine\n");
}

TEST(UserLeavesBySystem, BlocksTheNetworkThatIsConnected) {
    const Ending ending =
        runStory(46, air({kCafe, kHotel}, storing({{}, {.id = 2, .realm = "b.example"}})), [](World& world) {
            world.advance(5s);
            std::string text = connectedTo(world) + " ";
            world.perform(kUserLeft);
            world.perform(R"({"do":"dropConnection","reason":163842})");
            world.advance(60s);
            return text + connectedTo(world);
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe hotel");
}

/// Why a report is no act of the user against the network.
struct NoBlock {
    const char* what;
    std::function<void(World&)> before;
    std::string report;
    std::vector<std::string> log;
};

void act(World& world, const std::string& action) {
    world.perform(action);
}

const std::vector<NoBlock>& noBlocks() {
    static const std::vector<NoBlock> all = {
        {"the session is away",
         [](World& w) { act(w, R"({"do":"setSession","session":"disconnected"})"); },
         kUserLeft,
         {"Current session is not active, don't update the blocked network list."}},
        {"the radio is off",
         [](World& w) { act(w, R"({"do":"radio","software":"off"})"); },
         kUserLeft,
         {"Radio turned off, don't update the blocked network list."}},
        {"the function is off",
         [](World& w) { switchHs20(w, false); },
         kUserLeft,
         {"HS20 not enabled, don't update the blocked network list."}},
        {"another network is being joined by hand",
         [](World& w) {
             act(w, R"({"do":"set","connectMs":5000})");
             connect(w, "hotel");
             w.advance(1s);
         },
         kUserLeft,
         {"Manually connect to HS20 network started, this network maybe disconnected for we are going to "
          "connect another network."}},
        {"the system is joining another",
         [](World& w) {
             act(w, R"({"do":"set","connectMs":5000})");
             act(w, R"({"do":"osConnect","ssid":"home"})");
             w.advance(1s);
         },
         kUserLeft,
         {"Connection started by OS, HS20 network may be disconected,we should not block any HS20 network "
          "from auto connecting in this case."}},
        {"it is another network",
         [](World&) {},
         R"({"do":"userDisconnect","ssid":"hotel"})",
         {"Connection still in active.",
          "Check if the active connection is the connection to be disconnected.",
          "Windows disconnected network with ssid=hotel while the active connection with ssid=cafe"}},
        {"it is no hotspot",
         [](World&) {},
         R"({"do":"userDisconnect","ssid":"cafe","isHs20":0})",
         {"Check if the active connection is the connection to be disconnected.",
          "ERROR: Not a HS20 network."}},
        {"its SSID is too long",
         [](World&) {},
         moduleMessage(5, bssRecord("02aa00000001", "cafe" + std::string(30, 'x'))),
         {"Check if the active connection is the connection to be disconnected."}},
    };
    return all;
}

TEST(UserLeavesBySystem, BlocksNothingThatMayBeASideEffect) {
    for (const NoBlock& c : noBlocks()) {
        const std::string scenario =
            air({kCafe, kHotel}, storing({{}, {.id = 2, .realm = "b.example", .autoConnect = false}}));
        const Ending ending = runStory(47, scenario, [&](World& world) {
            world.advance(5s);
            c.before(world);
            const std::size_t before = world.logSize();
            world.perform(c.report);
            std::vector<std::string> expected = {
                "### IHV reports HS20 network has been disconnected manually by user. ###"};
            expected.insert(expected.end(), c.log.begin(), c.log.end());
            return missingInOrder(world, expected, before) +
                   (lines(world, kBlocks) == 0 ? "" : "blocked all the same");
        });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text, "") << c.what;
    }
}

TEST(UserLeavesBySystem, BlocksNothingBeforeTheFirstConnection) {
    const Ending ending = runStory(48, air({kCafe}), [](World& world) {
        world.advance(5s);
        world.perform(kUserLeft);
        return missingInOrder(world, {"No last connection history."}) + std::to_string(lines(world, kBlocks));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "0");
}

// The network is hidden, so that its connection ends and no new one comes of it.
TEST(UserLeavesBySystem, BlocksUpToASecondAfterTheEndOfTheConnection) {
    for (const int pause : {0, 999, 1000, 1001, 5000}) {
        const Ending ending = runStory(49, air({kCafe}, storing({{}})), [&](World& world) {
            world.advance(5s);
            world.perform(on("hide", 1));
            world.advance(milliseconds(pause));
            world.perform(kUserLeft);
            return missingInOrder(world, {"Connection disconnected earlier."}) +
                   std::to_string(lines(world, kBlocks));
        });
        EXPECT_TRUE(ending.isOrderly) << pause << ending.errors;
        EXPECT_EQ(ending.text, pause <= 1000 ? "1" : "0") << pause;
    }
}

TEST(UserLeavesBySystem, BlocksFromTwoSecondsAfterTheFunctionWasSwitched) {
    for (const int pause : {500, 1999, 2000, 2001}) {
        const Ending ending = runStory(50, air({kCafe}, storing({{}})), [&](World& world) {
            world.advance(5s);
            switchHs20(world, false);
            world.advance(5s);
            switchHs20(world, true);
            world.advance(milliseconds(pause));
            std::string text = connectedTo(world) + " ";
            world.perform(kUserLeft);
            const int skipped = lines(
                world,
                "Skip blocking the network with ssid=cafe since we just toggled the enable/disable hs20, "
                "millisecond elapsed=" +
                    std::to_string(pause));
            return text + std::to_string(lines(world, kBlocks)) + std::to_string(skipped);
        });
        EXPECT_TRUE(ending.isOrderly) << pause << ending.errors;
        EXPECT_EQ(ending.text, pause < 2000 ? "cafe 01" : "cafe 10") << pause;
    }
}

// Also on a clock that was set back since: the switch seems to lie ahead, but there was none.
TEST(UserLeavesBySystem, BlocksRightAfterTheStart) {
    const Ending ending = runStory(51, air({kCafe}, storing({{}})), [](World& world) {
        world.advance(300ms);
        world.perform(kUserLeft);
        return connectedTo(world) + std::to_string(lines(world, kBlocks));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "cafe1");
}

struct SessionChange {
    bool isByClient;
    int pause;
    const char* connected;
    const char* line;
};

TEST(SessionChange, OpensWhatWasBlockedLessThan800MillisecondsAgo) {
    const char* const recent = "\tThis network was blocked not long ago, unblock it";
    const char* const old = "\tThis network was blocked long time ago, don't unblock it.";
    const char* const user = "This network with ssid=cafe has been blocked by user, don't unblock it.";
    const SessionChange changes[] = {
        {false, 0, "cafe", recent}, {false, 799, "cafe", recent}, {false, 800, "-", old},
        {false, 801, "-", old},     {true, 0, "-", user},         {true, 799, "-", user},
    };
    for (const SessionChange& c : changes) {
        const Ending ending = runStory(52, air({kCafe}, storing({{}})), [&](World& world) {
            world.advance(5s);
            if (c.isByClient) {
                disconnect(world, "cafe");
            } else {
                world.perform(kUserLeft);
                world.perform(R"({"do":"dropConnection"})");
            }
            world.advance(milliseconds(c.pause));
            world.perform(R"({"do":"sessionChange","eventType":7,"sessionId":3})");
            std::vector<std::string> expected = {
                "### [Session] IHV reports session changed. ###", "\tEventType=7, sessionId=3",
                "[Session] A session has been locked.", "Enter resetAllNumRetries."};
            if (!c.isByClient)
                expected.push_back("The network with ssid=cafe has been blocked for " +
                                   std::to_string(c.pause) + " millisec");
            expected.emplace_back(c.line);
            std::string missing = missingInOrder(world, expected);
            world.advance(30s);
            return missing + connectedTo(world);
        });
        EXPECT_TRUE(ending.isOrderly) << c.pause << ending.errors;
        EXPECT_EQ(ending.text, c.connected) << c.pause << (c.isByClient ? " by the client" : "");
    }
}

TEST(SessionChange, IsToldByItsKind) {
    const std::vector<std::pair<int, std::string>> kinds = {
        {0, "[Session] Unknown event type."},
        {1, "[Session] A session was connected to the console session."},
        {2, "[Session] A session was disconnected from the console session."},
        {3, "[Session] A session was connected to the remote session."},
        {4, "[Session] A session was disconnected from the remote session."},
        {5, "[Session] A user has logged on to the session."},
        {6, "[Session] A user has logged off of the session."},
        {7, "[Session] A session has been locked."},
        {8, "[Session] A session has been unlocked."},
        {9, "[Session] A session has changed its remote controlled status."},
        {10, "[Session] Unknown event type."},
        {1000, "[Session] Unknown event type."},
    };
    const Ending ending = runStory(53, "{}", [&](World& world) {
        std::string missing;
        for (const auto& [type, text] : kinds) {
            const std::size_t before = world.logSize();
            world.perform(R"({"do":"sessionChange","sessionId":2,"eventType":)" + std::to_string(type) + "}");
            missing += missingInOrder(
                world,
                {"\tEventType=" + std::to_string(type) + ", sessionId=2", text, "Enter resetAllNumRetries."},
                before);
        }
        const std::size_t before = world.logSize();
        world.perform(moduleMessage(6, bytesOfHex("01000000020000")));
        return missing + messagesSince(world, before);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "### [Session] IHV reports session changed. ###\n");
}

TEST(Unblocking, ByTheSystemsOwnConnectionTakesWhatIsFresh) {
    for (const int pause : {0, 799, 800}) {
        const Ending ending = runStory(54, air({kCafe}, storing({{}})), [&](World& world) {
            world.advance(5s);
            world.perform(kUserLeft);
            world.advance(milliseconds(pause));
            world.perform(R"({"do":"osConnect","ssid":"home"})");
            world.advance(5s);
            world.perform(R"({"do":"dropConnection"})");
            world.advance(30s);
            return connectedTo(world);
        });
        EXPECT_TRUE(ending.isOrderly) << pause << ending.errors;
        EXPECT_EQ(ending.text, pause < 800 ? "cafe" : "-") << pause;
    }
}

// What opens a network that the user has left by the client.
TEST(Unblocking, ByTheRightCredentialOrAFreshStartAlone) {
    struct Case {
        const char* what;
        std::function<void(World&)> act;
        const char* connected;
    };
    const auto add = [](World& world, const std::string& realm, bool autoConnect) {
        Json::Value data = parsed(tlsData(realm));
        data["AutoConnect"] = autoConnect;
        data["AccessType"] = 1;
        world.hotspot().send("ADD_CREDENTIAL", data.toStyledString());
    };
    const auto edit = [](World& world, int id, bool autoConnect) {
        Json::Value data = parsed(ttlsData("a.example"));
        data["Id"] = id;
        data["AutoConnect"] = autoConnect;
        data["AccessType"] = 1;
        world.hotspot().send("EDIT_CREDENTIAL", data.toStyledString());
    };
    const Case cases[] = {
        {"nothing", [](World&) {}, "-"},
        {"a credential that fits", [&](World& w) { add(w, "a.example", true); }, "cafe"},
        {"a credential for another realm", [&](World& w) { add(w, "b.example", true); }, "-"},
        {"a credential for the user's hand", [&](World& w) { add(w, "a.example", false); }, "-"},
        {"one that may connect now and might not before", [&](World& w) { edit(w, 2, true); }, "cafe"},
        {"one that may connect now and might before", [&](World& w) { edit(w, 1, true); }, "-"},
        {"the radio",
         [](World& w) {
             act(w, R"({"do":"radio","software":"off"})");
             act(w, R"({"do":"radio","software":"on"})");
         },
         "cafe"},
        {"an arrival of the adapter", [](World& w) { act(w, R"({"do":"insertAdapter"})"); }, "cafe"},
        {"the function off and on",
         [](World& w) {
             switchHs20(w, false);
             switchHs20(w, true);
         },
         "-"},
        {"a session change",
         [](World& w) { act(w, R"({"do":"sessionChange","eventType":8,"sessionId":1})"); }, "-"},
    };
    for (const Case& c : cases) {
        const Ending ending = runStory(55,
                                       air({network(1, "cafe", both() + "," + lettingInAll())},
                                           storing({{}, {.id = 2, .autoConnect = false}})),
                                       [&](World& world) {
                                           world.advance(5s);
                                           disconnect(world, "cafe");
                                           world.advance(5s);
                                           c.act(world);
                                           world.advance(60s);
                                           return connectedTo(world);
                                       });
        EXPECT_TRUE(ending.isOrderly) << c.what << ending.errors;
        EXPECT_EQ(ending.text, c.connected) << c.what;
    }
}

}  // namespace
}  // namespace vexa::test
