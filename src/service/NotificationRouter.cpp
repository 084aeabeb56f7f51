#include "service/NotificationRouter.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstring>
#include <memory>
#include <optional>
#include <span>

#include "base/DiagnosticLog.h"
#include "channel/JsonText.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "contract/Ports.h"
#include "hotspot/IhvMessages.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "spectral/SAPortlink.h"
#include "text/LittleEndian.h"

namespace vexa {

namespace {

/// One notification and the two servers that it may concern.
struct Event {
    const WLAN_NOTIFICATION_DATA& notification;
    SAPortlink& spectral;
    SAHotSpotPortlink& hotspot;
};

struct Row {
    DWORD code;
    const char* traceText;
    int level;
    void (*act)(const Event& event);
};

std::shared_ptr<Supplicant> supplicantOf(const Event& event) {
    return SupplicantMgr::instance().findSupplicantToNotify(event.hotspot.m_interfaceGuid.get());
}

void sendToBoth(const Event& event, const std::string& text) {
    const IpcHandle spectral = event.spectral.m_hIpc;
    if (spectral == 0) return;
    IpcSend(spectral, text.data(), static_cast<std::uint32_t>(text.size()));
    IpcSend(event.hotspot.m_hIpc, text.data(), static_cast<std::uint32_t>(text.size()));
}

void onAdapterArrival(const Event& event) {
    event.hotspot.updateCardState();
    SupplicantMgr::instance().addSupplicantIfInterfaceExists();
    const std::string text = SAPortlink::BuildEventText(contract::kCardPlugIn);
    event.spectral.updateCardState();
    event.spectral.SendRadioState();
    sendToBoth(event, text);
}

// The clients hear of it before the Supplicant goes.
void onAdapterRemoval(const Event& event) {
    sendToBoth(event, SAPortlink::BuildEventText(contract::kCardPlugOut));
    event.hotspot.updateCardState();
    SupplicantMgr::instance().removeSupplicantIfInterfaceRemoved();
}

void onLinkChange(const Event& event) {
    event.spectral.SendCurrentChannel();
}

void onRoamingStart(const Event& event) {
    if (const auto supplicant = supplicantOf(event)) supplicant->onRoamingStart();
}

void onRoamingEnd(const Event& event) {
    if (const auto supplicant = supplicantOf(event)) supplicant->onRoamingEnd();
}

template <class Data>
std::optional<Data> dataOf(const WLAN_NOTIFICATION_DATA& notification) {
    if (notification.pData == nullptr || notification.dwDataSize < sizeof(Data)) return std::nullopt;
    Data data;
    std::memcpy(&data, notification.pData, sizeof(Data));
    return data;
}

void onRadioChange(const Event& event) {
    const auto radio = dataOf<WLAN_PHY_RADIO_STATE>(event.notification);
    const bool isOn = radio && radio->dot11HardwareRadioState == dot11_radio_state_on &&
                      radio->dot11SoftwareRadioState == dot11_radio_state_on;
    const std::string text = SAPortlink::BuildEventText(isOn ? contract::kRadioOn : contract::kRadioOff);
    if (const IpcHandle ipc = event.spectral.m_hIpc)
        IpcSend(ipc, text.data(), static_cast<std::uint32_t>(text.size()));
    event.hotspot.SendRadioState();
    if (const auto supplicant = supplicantOf(event))
        supplicant->onRadioStateChanged(radio ? &*radio : nullptr);
}

/// What the handlers read of a connection's data ends with the reason.
constexpr std::size_t kLeastConnectionData = offsetof(WLAN_CONNECTION_NOTIFICATION_DATA, dwFlags);

template <ResultCode (Supplicant::*Handle)(const WLAN_CONNECTION_NOTIFICATION_DATA*)>
void onConnection(const Event& event) {
    const auto supplicant = supplicantOf(event);
    if (!supplicant) return;
    const WLAN_NOTIFICATION_DATA& notification = event.notification;
    if (notification.pData == nullptr || notification.dwDataSize < kLeastConnectionData) {
        ((*supplicant).*Handle)(nullptr);
        return;
    }
    WLAN_CONNECTION_NOTIFICATION_DATA data{};
    std::memcpy(&data, notification.pData, std::min<std::size_t>(notification.dwDataSize, sizeof data));
    ((*supplicant).*Handle)(&data);
}

constexpr std::array<Row, 12> kAcmRows = {{
    {0, "wlan_notification_acm_start", 3, nullptr},
    {1, "wlan_notification_acm_autoconf_enabled", 3, nullptr},
    {2, "wlan_notification_acm_autoconf_disabled", 3, nullptr},
    {7, "wlan_notification_acm_scan_complete", 3, nullptr},
    {8, "wlan_notification_acm_scan_fail", 3, nullptr},
    {9, "wlan_notification_acm_connection_start", 2, onConnection<&Supplicant::onConnectionStart>},
    {10, "wlan_notification_acm_connection_complete", 3, onConnection<&Supplicant::onConnectionComplete>},
    {11, "wlan_notification_acm_connection_attempt_fail", 3, nullptr},
    {13, "wlan_notification_acm_interface_arrival", 3, onAdapterArrival},
    {14, "wlan_notification_acm_interface_removal", 3, onAdapterRemoval},
    {20, "wlan_notification_acm_disconnecting", 3, nullptr},
    {21, "wlan_notification_acm_disconnected", 3, onConnection<&Supplicant::onDisconnected>},
}};

constexpr std::array<Row, 16> kMsmRows = {{
    {0, "wlan_notification_msm_start", 2, nullptr},
    {1, "wlan_notification_msm_associating", 2, nullptr},
    {2, "wlan_notification_msm_associated", 3, nullptr},
    {3, "wlan_notification_msm_authenticating", 3, nullptr},
    {4, "wlan_notification_msm_connected", 2, onLinkChange},
    {5, "wlan_notification_msm_roaming_start", 3, onRoamingStart},
    {6, "wlan_notification_msm_roaming_end", 3, onRoamingEnd},
    {7, "wlan_notification_msm_radio_state_change", 2, onRadioChange},
    {8, "wlan_notification_msm_signal_quality_change", 2, nullptr},
    {9, "wlan_notification_msm_disassociating", 2, nullptr},
    {10, "wlan_notification_msm_disconnected", 2, onLinkChange},
    {11, "wlan_notification_msm_peer_join", 2, nullptr},
    {12, "wlan_notification_msm_peer_leave", 2, nullptr},
    {13, "wlan_notification_msm_adapter_removal", 2, nullptr},
    {14, "wlan_notification_msm_adapter_operation_mode_change", 2, nullptr},
    {15, "wlan_notification_msm_end", 2, nullptr},
}};

void dispatch(std::span<const Row> rows, const Event& event) {
    const auto row = std::find_if(rows.begin(), rows.end(), [&](const Row& candidate) {
        return candidate.code == event.notification.NotificationCode;
    });
    if (row == rows.end()) return;
    Log(row->level, "%s", row->traceText);
    if (row->act != nullptr) row->act(event);
}

void dispatchIhv(const Event& event) {
    const WLAN_NOTIFICATION_DATA& notification = event.notification;
    event.spectral.m_interfaceGuid.set(notification.InterfaceGuid);
    if (notification.pData == nullptr || notification.dwDataSize < kIhvHeaderSize) {
        Log(6, "Notification data is invalid: either no data or data size is too small.");
        return;
    }
    const Bytes message(static_cast<const std::byte*>(notification.pData), notification.dwDataSize);
    switch (readLittleEndian<std::uint32_t>(message, 0)) {
        case HS20_MODULE_SIGNATURE:
            onHs20IhvNotification(notification);
            return;
        case kSpectralSignature:
            event.spectral.HandleFullScanIndication(message);
            return;
        default:
            Log(6, "Unsupported module.");
    }
}

void route(const Event& event) {
    switch (event.notification.NotificationSource) {
        case WLAN_NOTIFICATION_SOURCE_ACM:
            return dispatch(kAcmRows, event);
        case WLAN_NOTIFICATION_SOURCE_MSM:
            return dispatch(kMsmRows, event);
        case WLAN_NOTIFICATION_SOURCE_IHV:
            return dispatchIhv(event);
        default:
            return;
    }
}

}  // namespace

void WINAPI onWlanNotification(PWLAN_NOTIFICATION_DATA pNotifData, PVOID pServer) {
    if (pNotifData == nullptr) return Log(6, "ERROR: Invalid pNotifData.");
    if (pServer == nullptr) return Log(6, "ERROR: Invalid SAPortlink.");
    const Event event{*pNotifData, *static_cast<SAPortlink*>(pServer), SAHotSpotPortlink::instance()};
    if (!withinMemoryOfJson([&] { route(event); }))
        Log(6, "ERROR: Out of memory, a WLAN notification was not handled to its end.");
}

// Without a Supplicant no message of the hotspot module has any effect.
bool onHs20IhvNotification(const WLAN_NOTIFICATION_DATA& notification) {
    SAHotSpotPortlink& hotspot = SAHotSpotPortlink::instance();
    const auto supplicant = SupplicantMgr::instance().findSupplicantToNotify(hotspot.m_interfaceGuid.get());
    if (!supplicant || notification.pData == nullptr) return false;
    const IhvMessage message =
        parseIhvMessage({static_cast<const std::byte*>(notification.pData), notification.dwDataSize});
    switch (message.subtype) {
        case IhvNotification::StateChanged:
            hotspot.SendSupplicantState(message.block);
            break;
        case IhvNotification::NetworkListChanged:
            supplicant->onNetworkListChanged(message.payload);
            break;
        case IhvNotification::AnqpInfoChanged:
            supplicant->onAnqpInfoChanged(message.payload);
            break;
        case IhvNotification::AnqpQueryCompleted:
            supplicant->onAnqpQueryCompleted();
            break;
        case IhvNotification::UserDisconnected:
            supplicant->onUserDisconnected(message.payload);
            break;
        case IhvNotification::SessionChanged:
            supplicant->onSessionChanged(message.payload);
            break;
        default:
            break;
    }
    return true;
}

}  // namespace vexa
