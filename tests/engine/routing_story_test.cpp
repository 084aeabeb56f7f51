#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"
#include "service/CommandLine.h"

namespace vexa::test {
namespace {

std::string notify(int source, int code, const std::string& dataHex = "") {
    return doing("notify", R"("source":)" + std::to_string(source) + R"(,"code":)" + std::to_string(code) +
                               R"(,"dataHex":")" + dataHex + "\"");
}

constexpr int kAcm = 8;
constexpr int kMsm = 16;
constexpr int kIhv = 64;

/// What the log calls the notifications of this source.
void expectNames(Story& story, int source, const std::vector<std::string>& names) {
    story.forget();
    for (int code = 0; code <= 25; ++code)
        story.perform(notify(source, code));
    const std::string prefix = source == kAcm ? "wlan_notification_acm_" : "wlan_notification_msm_";
    std::vector<std::string> lines;
    for (const std::string& name : names)
        lines.push_back(prefix + name);
    story.expectLines(lines);
    story.expectOfLog("names", count(story.messages(), prefix), static_cast<int>(names.size()));
}

STORY(Routing, EveryKnownCodeLeavesItsLineAndOthersNone, "{}") {
    settle(story);
    expectNames(story, kAcm,
                {"start", "autoconf_enabled", "autoconf_disabled", "scan_complete", "scan_fail",
                 "connection_start", "connection_complete", "connection_attempt_fail", "interface_arrival",
                 "interface_removal", "disconnecting", "disconnected"});
    expectNames(
        story, kMsm,
        {"start", "associating", "associated", "authenticating", "connected", "roaming_start", "roaming_end",
         "radio_state_change", "signal_quality_change", "disassociating", "disconnected", "peer_join",
         "peer_leave", "adapter_removal", "adapter_operation_mode_change", "end"});
    story.forget();
    for (const int source : {4, 32, 0})
        for (int code = 0; code <= 25; ++code)
            story.perform(notify(source, code));
    story.expectOfLog("log of other sources", story.messages(), "");
}

STORY(Routing, BadIhvNotificationsEndInTheirLineAndChangeNothingElse, R"({"spectrum":{"channels":[1]}})") {
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
    settle(story);
    for (const auto& [dataHex, line] : cases) {
        story.forget();
        story.perform(notify(kIhv, 3, dataHex));
        story.expectOfLog(dataHex, story.messages(), line);
        story.expect("spectral events", story.spectral().events().size(), 0U);
        story.expect("hotspot events", heard(story), "");
    }
}

STORY(Routing, CommandsOfTheHotspotPortLeaveOneErrorLineWhenTheyCanNotBeRead, "{}") {
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
    settle(story);
    const auto expectHeard = [&](const std::string& message, const std::string& line, const char* wanted) {
        story.forget();
        story.hotspot().sendRaw(message);
        story.advance(platform::Duration(0));
        story.expectOfLog(message, story.messages(), line);
        story.expect("heard", heard(story), wanted);
    };
    for (const auto& [message, line] : cases)
        expectHeard(message, line, "");
    for (const char* name : {"5", "true", "{}", R"([\"cafe\"])", R"(\"0123456789abcdef0123456789abcdef!\")"})
        expectHeard(
            R"({"CommandId":"CONNECT_NETWORK","Data":"{\"NetWorkName\":)" + std::string(name) + "}\"}",
            "connectBss failed.\nSend connection result to vexa.\n", "CONNECT_DISCONNECT");
}

// The world's table is empty: the first guess of its size fits, and it has grown when the rows are asked for.
STORY(PortCheck, AsksAgainForATableThatHasOutgrownAGuessThatFitted, "{}") {
    story.act("fail", R"("call":"GetTcpTable","error":122,"skip":1)");
    bool isFree = false;
    story.expect("is told", isTcpPortFree(isFree, 8002), true);
    story.expect("is free", isFree, true);
}

}  // namespace
}  // namespace vexa::test
