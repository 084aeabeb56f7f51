#include <cstddef>
#include <optional>
#include <string_view>
#include <utility>

#include "base/DiagnosticLog.h"
#include "base/WlanText.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "platform/CodePage.h"
#include "platform/Registry.h"
#include "text/ScopeGuard.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::LockGuard;

constexpr DWORD kReasonCapacity = 64;

const char* onOrOffInCapitals(bool on) {
    return on ? "ON" : "OFF";
}

std::wstring profileNameOf(const WLAN_CONNECTION_NOTIFICATION_DATA& data) {
    return fromWlanText({data.strProfileName, WLAN_MAX_NAME_LENGTH});
}

std::wstring logReason(const WLAN_CONNECTION_NOTIFICATION_DATA& data) {
    WCHAR text[kReasonCapacity] = {};
    WlanReasonCodeToString(data.wlanReasonCode, kReasonCapacity, text, nullptr);
    std::wstring reason = fromWlanText({text, kReasonCapacity});
    Log(3, "Reason code desc=%s", platform::inCodePage(reason).c_str());
    return reason;
}

void writeEapMethodToRegistry(std::uint32_t eapMethod) {
    platform::writeRegistryNumber("Software\\Korvane\\Vexa", "EapMethod", eapMethod);
}

}  // namespace

// A longer SSID with the same beginning counts as own.
bool Supplicant::isOwnConnection(const WLAN_CONNECTION_NOTIFICATION_DATA& data) const {
    const std::string_view field(reinterpret_cast<const char*>(data.dot11Ssid.ucSSID), kMaxSsidLength);
    return !m_connectingSsid.empty() && field.starts_with(m_connectingSsid);
}

ResultCode Supplicant::onConnectionStart(const WLAN_CONNECTION_NOTIFICATION_DATA* data) {
    if (data == nullptr) return kInvalidArgument;
    const LockGuard lock(g_hs20Lock);
    const std::wstring name = profileNameOf(*data);
    if (isOwnConnection(*data)) {
        LogWide(3, L"Connection start event: connection initiated by HS20, profile name=%s", name.c_str());
        if (!m_engine.m_bConnectionStarted)
            Log(6,
                "ERROR: m_bConnectionStarted should be set to false after HS20 initiated a new connection.");
        if (m_bManualConnectStarted) Log(3, "Manual connection started.");
    } else {
        LogWide(3, L"Connection start event: connection not initiated by HS20, profile name=%s",
                name.c_str());
        m_bConnectionStartedByOs = true;
        m_engine.m_blockedNetworks.unblockRecentNetworks();
    }
    m_bHs20Connected = false;
    return kSuccess;
}

ResultCode Supplicant::onConnectionComplete(const WLAN_CONNECTION_NOTIFICATION_DATA* data) {
    const LockGuard lock(g_hs20Lock);
    std::uint32_t eapMethod = 0;
    const ScopeGuard atEnd([&] {
        m_bUserDisconnecting = false;
        writeEapMethodToRegistry(eapMethod);
    });
    if (data == nullptr) {
        Log(6, "ERROR: No wlan connection notification data.");
        return kFailure;
    }
    if (data->dot11Ssid.uSSIDLength == 0 || data->dot11Ssid.uSSIDLength > kMaxSsidLength) {
        Log(6, "ERROR: Invalid ssid or ssid length.");
        return kFailure;
    }
    return isOwnConnection(*data) ? onOwnResult(*data, eapMethod) : onForeignResult(*data);
}

ResultCode Supplicant::onOwnResult(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t& eapMethod) {
    // Before anything that memory may not allow: the attempt has ended.
    m_connectingSsid.clear();
    m_engine.m_bConnectionStarted = false;
    const std::wstring name = profileNameOf(data);
    LogWide(3, L"Connection result initiated by HS20, clearing the cache, profile name=%s.", name.c_str());
    if (m_bManualConnectPending && carryOutPendingRequest(name)) return kSuccess;
    m_engine.m_hConnectionCompletedEvent.set();
    NetworkProfile* profile = nullptr;
    if (m_engine.m_profileMgr.findProfileByName(name, profile) != kSuccess) {
        Log(6, "ERROR: Cannot get profile in profile manager.");
        return kFailure;
    }
    return data.wlanReasonCode == 0 ? onSuccess(data, *profile, eapMethod) : onFailure(data, *profile);
}

// Once a request is under way the finished attempt leaves no trace: what the client hears comes from the new
// one. If none can be made the finished attempt is one like any other, and its walk goes on where it was.
bool Supplicant::carryOutPendingRequest(const std::wstring& finished) {
    Log(3, "###User manual connecting request pending, we are going to connect now.###");
    NetworkProfile* profile = nullptr;
    std::optional<NetworkProfile> used;
    if (m_engine.m_profileMgr.findProfileByName(finished, profile) == kSuccess) used = *profile;
    const std::vector<std::int32_t> tried = m_triedCredentialIds;
    const bool wasManual = std::exchange(m_bManualConnectStarted, false);
    m_bManualConnectPending = false;
    const bool isRefused = connectBssNow(m_pendingManualSsid) != kSuccess;
    if (m_engine.m_bConnectionStarted) return true;
    m_bManualConnectStarted = wasManual;
    m_triedCredentialIds = tried;
    if (used && m_engine.m_profileMgr.findProfileByName(finished, profile) == kSuccess) {
        used->m_priority = profile->m_priority;
        *profile = *used;
    }
    if (isRefused) sendConnectionResult(ConnectionResult::kFailed);
    return false;
}

ResultCode Supplicant::onSuccess(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& profile,
                                 std::uint32_t& eapMethod) {
    LogWide(3, L"Connection succeeded! profile name=%s", profile.m_name.c_str());
    const std::string_view ssid = bytesOf(data.dot11Ssid);
    m_bHs20Connected = true;
    setState(SupplicantState::Connected);
    Log(3, ">>>>Clear cred num retries on conn success: profileName=%s",
        narrowFromWide(profile.m_name).c_str());
    const Hs20Network* const network = m_engine.m_networkList.findBySsid(ssid);
    if (network == nullptr) return kFailure;
    if (profile.m_credId >= 1) m_engine.m_retryHelper.setNumRetries(profile.m_credId, ssid, 0);
    if (m_history.addConnection(data.dot11Ssid, network->m_macAddress, m_engine.m_networkList) != kSuccess)
        Log(6, "ERROR: Create connection history failed.");
    eapMethod = static_cast<std::uint32_t>(profile.m_eapMethod);
    return endAttempt(data, ConnectionResult::kSucceeded);
}

ResultCode Supplicant::onFailure(const WLAN_CONNECTION_NOTIFICATION_DATA& data,
                                 const NetworkProfile& profile) {
    LogWide(3, L"Connection failed! profile name=%s", profile.m_name.c_str());
    setState(SupplicantState::Disconnected);
    if (m_bUserDisconnecting) return endAttempt(data, ConnectionResult::kFailed);
    if (profile.m_eapMethod == kEapMethodTls && !profile.m_bMachineAuth) return tryMachineMode(data, profile);
    if (m_bManualConnectStarted) return tryNextCredential(data);
    return report(data, ConnectionResult::kFailed);
}

// Once per attempt: the new profile is one for the machine, and its failure goes on with the next credential.
ResultCode Supplicant::tryMachineMode(const WLAN_CONNECTION_NOTIFICATION_DATA& data,
                                      const NetworkProfile& failed) {
    Log(3,
        "Connection using EAP-TLS with authMode=machineOrUser failed,trying to use EAP-TLS with authMode=machine.");
    const Hs20Network* const network = m_engine.m_networkList.findBySsid(bytesOf(data.dot11Ssid));
    if (network == nullptr) {
        Log(6, "ERROR: Cannot get the BSS when connection failed.");
        return kFailure;
    }
    if (failed.m_credId <= 0) {
        Log(6, "ERROR: Invalid credential id.");
        return kFailure;
    }
    const Credential* const credential = findCredential(failed.m_credId);
    if (credential == nullptr) {
        Log(6, "ERROR: Cannot get credential.");
        return kFailure;
    }
    m_engine.m_profileMgr.deleteProfile(failed.m_id);
    NetworkProfile* profile = nullptr;
    if (m_engine.m_profileMgr.addProfileFromCredential(*credential, *network, true,
                                                       m_engine.m_config.homeRealm(), profile) != kSuccess) {
        Log(6, "ERROR: Cannot add network profile.");
        return kFailure;
    }
    if (connectToNetwork(*network, *profile) != kSuccess) {
        Log(6, "ERROR: Connect to network failed.");
        return kFailure;
    }
    return kSuccess;
}

ResultCode Supplicant::endAttempt(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t outcome) {
    if (m_bManualConnectStarted) {
        m_bManualConnectStarted = false;
        m_triedCredentialIds.clear();
    }
    return report(data, outcome);
}

ResultCode Supplicant::report(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t outcome) {
    ConnectionResult result;
    result.m_result = outcome;
    result.m_profileName = profileNameOf(data);
    result.m_ssid = wideFromNarrow(bytesOf(data.dot11Ssid));
    result.m_reason = logReason(data);
    tellClient([&](const ClientEvents& events) {
        events.sendConnectionResult(result);
        events.sendInternetAccess();
    });
    return kSuccess;
}

// The client hears of a success, whatever the reason: the connection was none of this program's.
ResultCode Supplicant::onForeignResult(const WLAN_CONNECTION_NOTIFICATION_DATA& data) {
    const bool isSuccess = data.wlanReasonCode == 0;
    const bool isStartKnown = std::exchange(m_bConnectionStartedByOs, false);
    LogWide(3, L"Connection result not initiated by HS20, profile name=%s, result=%s",
            profileNameOf(data).c_str(), isSuccess ? L"Success" : L"Failure");
    setState(isSuccess ? SupplicantState::Connected : SupplicantState::Disconnected);
    if (!isStartKnown)
        Log(6, "ERROR: m_bConnectionStartedByOs is not set to true when connecting completed.");
    sendConnectionResult(ConnectionResult::kSucceeded);
    tellClient([](const ClientEvents& events) { events.sendInternetAccess(); });
    return kSuccess;
}

ResultCode Supplicant::onDisconnected(const WLAN_CONNECTION_NOTIFICATION_DATA* data) {
    const ScopeGuard atEnd([this] {
        m_bUserDisconnecting = false;
        writeEapMethodToRegistry(0);
    });
    Log(3, "Received Wlan disconnected event.");
    if (data == nullptr) return kFailure;
    logReason(*data);
    // Under one lock: the state wakes the connecting thread, which must find the query under way.
    const LockGuard lock(g_hs20Lock);
    setState(SupplicantState::Disconnected);
    if (m_mgr.takePendingRealmUpdate())
        queryHs20NetworkAnqpInfo();
    else
        sendNetworkList();
    if (m_history.updateDisconnection(data->dot11Ssid, m_engine.m_networkList) != kSuccess)
        Log(6, "ERROR: Update connection history failed.");
    m_bHs20Connected = false;
    return kSuccess;
}

void Supplicant::onRoamingStart() {
    m_bRoaming = true;
}

void Supplicant::onRoamingEnd() {
    if (!m_bRoaming.exchange(false))
        Log(3, "Received wlan roaming ended event while not received wlan roaming not started event.");
}

// A radio change wipes the slate, in both directions.
ResultCode Supplicant::onRadioStateChanged(const WLAN_PHY_RADIO_STATE* data) {
    if (data == nullptr) return kInvalidArgument;
    const LockGuard lock(g_hs20Lock);
    const bool isOn = data->dot11SoftwareRadioState == dot11_radio_state_on;
    if (isOn == m_bRadioOn) {
        Log(3, "Supplicant already set radio state to %s while requested to set radio state to %s",
            onOrOffInCapitals(isOn), onOrOffInCapitals(isOn));
        return kSuccess;
    }
    setRadioState(isOn);
    if (!isOn) m_connectingSsid.clear();
    Log(3, "Supplicant state=%s when radio state changed.", nameOf(m_state));
    setState(SupplicantState::Disconnected);
    m_engine.m_bConnectionStarted = false;
    m_engine.m_retryHelper.resetAllNumRetries();
    m_engine.m_blockedNetworks.clear();
    m_triedCredentialIds.clear();
    sendNetworkList();
    return kSuccess;
}

}  // namespace vexa
