#include "simulation/parts/ConnectionSteps.h"

namespace vexa::simulation {

namespace {

constexpr DWORD kAcm = WLAN_NOTIFICATION_SOURCE_ACM;
constexpr DWORD kMsm = WLAN_NOTIFICATION_SOURCE_MSM;

constexpr DWORD kConnectionStart = 9;
constexpr DWORD kConnectionComplete = 10;
constexpr DWORD kAttemptFail = 11;
constexpr DWORD kDisconnecting = 20;
constexpr DWORD kDisconnected = 21;

constexpr DWORD kAssociating = 1;
constexpr DWORD kAssociated = 2;
constexpr DWORD kAuthenticating = 3;
constexpr DWORD kConnected = 4;
constexpr DWORD kLinkDisassociating = 9;
constexpr DWORD kLinkDisconnected = 10;

constexpr auto kNoChange = std::nullopt;
constexpr bool kWithReason = true;

constexpr ConnectionStep kBeginSteps[] = {
    {kAcm, kConnectionStart, wlan_interface_state_associating},
    {kMsm, kAssociating},
};
constexpr ConnectionStep kAcceptSteps[] = {
    {kMsm, kAssociated},
    {kMsm, kAuthenticating, wlan_interface_state_authenticating},
    {kMsm, kConnected, wlan_interface_state_connected},
    {kAcm, kConnectionComplete, kNoChange, kWithReason},
};
constexpr ConnectionStep kRefuseSteps[] = {
    {kAcm, kAttemptFail, wlan_interface_state_disconnected, kWithReason},
    {kAcm, kConnectionComplete, kNoChange, kWithReason},
};

constexpr ConnectionStep kSystemBeginSteps[] = {
    {kAcm, kConnectionStart, wlan_interface_state_associating},
};
constexpr ConnectionStep kSystemAcceptSteps[] = {
    {kAcm, kConnectionComplete, wlan_interface_state_connected, kWithReason},
};

constexpr ConnectionStep kDisconnectSteps[] = {
    {kAcm, kDisconnecting, wlan_interface_state_disconnecting, kWithReason},
    {kMsm, kLinkDisassociating},
    {kMsm, kLinkDisconnected, wlan_interface_state_disconnected},
    {kAcm, kDisconnected, kNoChange, kWithReason},
};
constexpr ConnectionStep kDropSteps[] = {
    {kAcm, kDisconnecting, wlan_interface_state_disconnecting, kWithReason},
    {kMsm, kLinkDisconnected, wlan_interface_state_disconnected},
    {kAcm, kDisconnected, kNoChange, kWithReason},
};
constexpr ConnectionStep kLoseSteps[] = {
    {kAcm, kDisconnected, wlan_interface_state_disconnected, kWithReason},
};
constexpr ConnectionStep kCancelSteps[] = {
    {kAcm, kConnectionComplete, wlan_interface_state_disconnected, kWithReason},
};
constexpr ConnectionStep kGiveUpSteps[] = {
    {kAcm, kConnectionComplete, wlan_interface_state_disconnected, kWithReason},
    {kAcm, kDisconnected},
};

}  // namespace

constexpr ConnectionCourse kAskedFor = {kBeginSteps, kAcceptSteps, kRefuseSteps};
constexpr ConnectionCourse kSystemsOwn = {kSystemBeginSteps, kSystemAcceptSteps, kCancelSteps};
constexpr ConnectionSteps kDisconnect = kDisconnectSteps;
constexpr ConnectionSteps kDrop = kDropSteps;
constexpr ConnectionSteps kLose = kLoseSteps;
constexpr ConnectionSteps kCancel = kCancelSteps;
constexpr ConnectionSteps kGiveUp = kGiveUpSteps;

}  // namespace vexa::simulation
