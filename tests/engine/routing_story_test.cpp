#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

std::string notify(int source, int code, const std::string& dataHex = "") {
    return doing("notify", R"("source":)" + std::to_string(source) + R"(,"code":)" + std::to_string(code) +
                               R"(,"dataHex":")" + dataHex + "\"");
}

constexpr int kAcm = 8;
constexpr int kMsm = 16;
constexpr int kIhv = 64;

TEST(Routing, EveryKnownCodeLeavesItsLineAndOthersNone) {
    EXPECT_STORY("{}", [](Story& story) {
        settle(story);
        for (const int source : {kAcm, kMsm, 4, 32, 0})
            for (int code = 0; code <= 25; ++code)
                story.perform(notify(source, code));
        story.expect("log", story.messages(),
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
    });
}

TEST(Routing, BadIhvNotificationsEndInTheirLineAndChangeNothingElse) {
    const std::string tooSmall = "Notification data is invalid: either no data or data size is too small.\n";
    const std::string unsupported = "Unsupported module.\n";
    const std::pair<const char*, std::string> cases[] = {
        {"", tooSmall},
        {"005ec4060000000002000000325c00", tooSmall},
        {"015ec4060000000002000000325c0000", unsupported},
        {"06c45e000000000002000000325c0000", unsupported},
        {"005ec4030000000000000000000000000000", ""},
        {"005ec4060000000003000000325c0000", ""},
        {"005ec4060000000001000000325c0000", ""},
        {"005ec4060000000001000000325c0000ffff00112233", ""},
    };
    EXPECT_STORY(R"({"spectrum":{"channels":[1]}})", [&](Story& story) {
        settle(story);
        for (const auto& [dataHex, line] : cases) {
            story.forget();
            story.perform(notify(kIhv, 3, dataHex));
            story.expect(dataHex, story.messages(), line);
            story.expect("spectral events", story.spectral().events().size(), 0U);
            story.expect("hotspot events", heard(story), "");
        }
    });
}

TEST(Routing, CommandsOfTheHotspotPortLeaveOneErrorLineWhenTheyCanNotBeRead) {
    const std::string command = "ERROR: Invalid command received from UI, command=";
    const std::string data = "ERROR: Invalid data received from UI, command=GET_RADIO\n";
    const std::pair<const char*, std::string> cases[] = {
        {"nonsense", command + "\n"},
        {"[]", command + "\n"},
        {"17", command + "\n"},
        {"\"GET_RADIO\"", command + "\n"},
        {R"({"CommandId":17})", command + "\n"},
        {R"({"CommandId":["GET_RADIO"]})", command + "\n"},
        {R"({"CommandId":"get_radio"})", command + "get_radio\n"},
        {R"({"CommandId":"GET_RADIO","Data":{}})", data},
        {R"({"CommandId":"GET_RADIO","Data":3})", data},
    };
    EXPECT_STORY("{}", [&](Story& story) {
        settle(story);
        for (const auto& [message, line] : cases) {
            story.forget();
            story.hotspot().sendRaw(message);
            story.advance(platform::Duration(0));
            story.expect(message, story.messages(), line);
            story.expect("heard", heard(story), "");
        }
    });
}

}  // namespace
}  // namespace vexa::test
