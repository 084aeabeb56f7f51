#include <gtest/gtest.h>

#include <map>
#include <sstream>

#include "engine/Story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

// The log's lines from the n-th on, without their numbers and times.
std::string messagesOf(const std::string& log) {
    std::istringstream stream(log);
    std::string messages;
    for (std::string line; std::getline(stream, line);)
        messages += line.substr(line.find("  ") + 2) + "\n";
    return messages;
}

std::string notify(const std::string& source, int code, const std::string& dataHex = "") {
    return R"({"do":"notify","source":)" + source + R"(,"code":)" + std::to_string(code) + R"(,"dataHex":")" +
           dataHex + R"("})";
}

// The connecting thread has had its first rounds and waits; it has lines of its own.
void settle(World& world) {
    world.advance(25s);
    world.spectral().events();
    world.hotspot().events();
}

constexpr const char* kAcm = "8";
constexpr const char* kMsm = "16";
constexpr const char* kIhv = "64";

TEST(Routing, EveryKnownCodeLeavesItsLineAndOthersNone) {
    const Ending ending = runStory(3, "{}", [](World& world) {
        settle(world);
        const std::size_t before = world.logSize();
        for (const char* source : {kAcm, kMsm, "4", "32", "0"})
            for (int code = 0; code <= 25; ++code)
                world.perform(notify(source, code));
        return messagesOf(world.log().substr(before));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "wlan_notification_acm_start\n"
              "wlan_notification_acm_autoconf_enabled\n"
              "wlan_notification_acm_autoconf_disabled\n"
              "wlan_notification_acm_scan_complete\n"
              "wlan_notification_acm_scan_fail\n"
              "wlan_notification_acm_connection_start\n"
              "wlan_notification_acm_connection_complete\n"
              "ERROR: No wlan connection notification data.\n"
              "wlan_notification_acm_connection_attempt_fail\n"
              "wlan_notification_acm_interface_arrival\n"
              "Enter addSupplicantIfInterfaceExists...\n"
              "Supplicant with GUID already exists, skip adding.\n"
              "Going to reset the existed supplicant...\n"
              "Enter resetAllNumRetries.\n"
              "wlan_notification_acm_interface_removal\n"
              "Enter removeSupplicantIfInterfaceRemoved...\n"
              "\tInterface card still inserted, don't remove supplicant.\n"
              "wlan_notification_acm_disconnecting\n"
              "wlan_notification_acm_disconnected\n"
              "Received Wlan disconnected event.\n"
              "wlan_notification_msm_start\n"
              "wlan_notification_msm_associating\n"
              "wlan_notification_msm_associated\n"
              "wlan_notification_msm_authenticating\n"
              "wlan_notification_msm_connected\n"
              "wlan_notification_msm_roaming_start\n"
              "wlan_notification_msm_roaming_end\n"
              "wlan_notification_msm_radio_state_change\n"
              "wlan_notification_msm_signal_quality_change\n"
              "wlan_notification_msm_disassociating\n"
              "wlan_notification_msm_disconnected\n"
              "wlan_notification_msm_peer_join\n"
              "wlan_notification_msm_peer_leave\n"
              "wlan_notification_msm_adapter_removal\n"
              "wlan_notification_msm_adapter_operation_mode_change\n"
              "wlan_notification_msm_end\n");
}

TEST(Routing, BadIhvNotificationsEndInTheirLineAndChangeNothingElse) {
    const std::string tooSmall = "Notification data is invalid: either no data or data size is too small.\n";
    const std::string unsupported = "Unsupported module.\n";
    const std::map<std::string, std::string> cases = {
        {"", tooSmall},
        {"005ec4060000000002000000325c00", tooSmall},
        {"015ec4060000000002000000325c0000", unsupported},
        {"06c45e000000000002000000325c0000", unsupported},
        {"005ec4030000000000000000000000000000", ""},
        {"005ec4060000000003000000325c0000", ""},
        {"005ec4060000000001000000325c0000", ""},
        {"005ec4060000000001000000325c0000ff", ""},
        {"005ec4060000000001000000325c0000ffff", ""},
        {"005ec4060000000001000000325c0000ffff00112233", ""},
        {"005ec4060000000001000000335c00000100", ""},
    };
    const Ending ending = runStory(4, R"({"spectrum":{"channels":[1]}})", [&](World& world) {
        std::string differences;
        settle(world);
        for (const auto& [dataHex, expected] : cases) {
            const std::size_t before = world.logSize();
            world.perform(notify(kIhv, 3, dataHex));
            const std::string got = messagesOf(world.log().substr(before));
            if (got != expected) differences += dataHex + " gave " + got;
        }
        return differences + world.spectral().ids() + world.hotspot().ids();
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(Routing, AnIhvNotificationOfAnyFormTellsTheSpectralServerItsInterface) {
    const Ending ending = runStory(5, R"({"spectrum":{"channels":[1]}})", [](World& world) {
        world.perform(R"({"do":"ihv","dataHex":"00","guid":"{00000000-0000-0000-0000-000000000009}"})");
        world.spectral().send("FULL_SCAN");
        world.advance(0ms);
        const Json::Value calls = world.perform(R"({"query":"calls"})");
        return calls[calls.size() - 1]["result"].asString();
    });
    EXPECT_EQ(ending.text, "1168") << ending.errors;
}

// Hardware and software state, and what each port hears.
TEST(Routing, RadioChangesReachBothPortsByTheirOwnRules) {
    struct Case {
        const char* action;
        const char* spectral;
        const char* hotspot;
    };
    const Case cases[] = {
        {R"({"do":"radio","hardware":"on","software":"off"})", "RADIO_OFF", "false\n"},
        {R"({"do":"radio","hardware":"off","software":"on"})", "RADIO_OFF", "true\n"},
        {R"({"do":"radio","hardware":"on","software":"on"})", "RADIO_ON", "true\n"},
        {R"({"do":"radio","hardware":"unknown","software":"on"})", "RADIO_OFF", "true\n"},
        {R"({"do":"notify","source":16,"code":7})", "RADIO_OFF", "true\n"},
        {R"({"do":"notify","source":16,"code":7,"dataHex":"0000000001000000010000"})", "RADIO_OFF", "true\n"},
        {R"({"do":"notify","source":16,"code":7,"dataHex":"000000000100000001000000"})", "RADIO_ON",
         "true\n"},
    };
    const Ending ending = runStory(6, "{}", [&](World& world) {
        std::string differences;
        settle(world);
        for (const Case& c : cases) {
            world.perform(c.action);
            const std::string spectral = world.spectral().ids();
            const auto hotspot = world.hotspot().events();
            if (spectral != c.spectral || hotspot.empty() || hotspot[0].id != "GET_RADIO" ||
                hotspot[0].dataText != c.hotspot)
                differences += std::string(c.action) + " gave " + spectral + "\n";
        }
        return differences;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(Routing, CommandsOfTheHotspotPortLeaveOneErrorLineWhenTheyCanNotBeRead) {
    const std::string command = "ERROR: Invalid command received from UI, command=";
    const std::string data = "ERROR: Invalid data received from UI, command=";
    const std::vector<std::pair<std::string, std::string>> cases = {
        {"nonsense", command},
        {"[]", command},
        {"17", command},
        {"\"GET_RADIO\"", command},
        {R"({"CommandId":17})", command},
        {R"({"CommandId":["GET_RADIO"]})", command},
        {R"({"CommandId":"get_radio"})", command + "get_radio"},
        {R"({"CommandId":"GET_RADIO","Data":{}})", data + "GET_RADIO"},
        {R"({"CommandId":"GET_RADIO","Data":3})", data + "GET_RADIO"},
    };
    const Ending ending = runStory(7, "{}", [&](World& world) {
        std::string differences;
        settle(world);
        for (const auto& [message, line] : cases) {
            const std::size_t before = world.logSize();
            world.hotspot().sendRaw(message);
            world.advance(0ms);
            const std::string got = messagesOf(world.log().substr(before));
            if (got != line + "\n") differences += message + " gave " + got;
        }
        return differences + world.hotspot().ids();
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

}  // namespace
}  // namespace vexa::test
