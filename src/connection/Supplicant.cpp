#include "connection/Supplicant.h"

#include <cassert>

#include "base/DiagnosticLog.h"
#include "base/WlanMemory.h"
#include "config/Config.h"
#include "config/ResultCodes.h"
#include "connection/SupplicantMgr.h"
#include "platform/Guid.h"

namespace vexa {

namespace {

using platform::LockGuard;

constexpr std::array<const char*, 14> kStateNames = {
    "InvalidState", "Initialized",       "Connecting",        "Connected",      "Disconnecting",
    "Disconnected", "InterfaceDisabled", "Scanning",          "Authenticating", "Associating",
    "Associated",   "Disassociating",    "Auth4WayHandshake", "GroupHandshake"};

SupplicantState stateOf(WLAN_INTERFACE_STATE state) {
    switch (state) {
        case wlan_interface_state_connected:
            return SupplicantState::Connected;
        case wlan_interface_state_disconnecting:
            return SupplicantState::Disconnecting;
        case wlan_interface_state_disconnected:
            return SupplicantState::Disconnected;
        case wlan_interface_state_associating:
            return SupplicantState::Associating;
        case wlan_interface_state_discovering:
            return SupplicantState::Scanning;
        case wlan_interface_state_authenticating:
            return SupplicantState::Authenticating;
        default:
            return SupplicantState::InvalidState;
    }
}

// What only the WLAN service can make true.
bool isClaim(SupplicantState state) {
    return state == SupplicantState::Connected || state == SupplicantState::Disconnecting ||
           state == SupplicantState::Disconnected || state == SupplicantState::Authenticating;
}

// Seconds: no report soon after the start may count as one soon after a switch.
constexpr std::int32_t kLongBeforeStart = 100;

const char* onOrOff(bool on) {
    return on ? "On" : "Off";
}

}  // namespace

const char* nameOf(SupplicantState state) {
    return kStateNames[static_cast<std::size_t>(state)];
}

Supplicant::Supplicant(const GUID& interfaceGuid, SupplicantMgr* mgr)
    : m_interfaceGuid(interfaceGuid), m_pMgr(mgr), m_lastHs20ToggleTime(getTimeValue()) {
    m_lastHs20ToggleTime.seconds -= kLongBeforeStart;
}

Supplicant::~Supplicant() {
    m_interworkingMgr.stopIfInited();
    closeWlanHandle();
}

int Supplicant::init() {
    Log(2, "Initializing supplicant...");
    if (const char* const error = initSteps()) {
        Log(6, "%s", error);
        Log(6, "ERROR: Initiailize supplicant failed.");
        deinit();
        m_interworkingMgr.stop();
        closeWlanHandle();
        return kSuccess;
    }
    m_bInitialized = true;
    Log(3, "Initialize supplicant succeeded.");
    return kSuccess;
}

// The line of the step that failed; null if none did.
const char* Supplicant::initSteps() {
    logInterfaceGuid();
    if (queryMacAddress() != kSuccess) return "ERROR: Query MAC address failed.";
    if (!openWlanHandle()) return "ERROR: Open wlan handle failed.";
    if (m_interworkingMgr.init() != kSuccess) return "ERROR: Failed to initi NetworkinMgr.";
    if (getHs20BssListFromIHV() != kSuccess)
        Log(6, "ERROR: Get HS20 network list failed in supplicant initialization.");
    setRadioState(isRadioOn());
    recordConnectionAtStart();
    setState(SupplicantState::Initialized);
    const LockGuard lock(g_hs20Lock);
    Log(3, "Supplicant State=%s", nameOf(m_state));
    return nullptr;
}

// A connection that exists already is recorded as though it began now.
void Supplicant::recordConnectionAtStart() {
    DOT11_SSID ssid{};
    MacAddress bssid{};
    if (queryCurrentConnection(ssid, bssid, false) != kSuccess) return;
    const LockGuard lock(g_hs20Lock);
    m_history.addConnection(ssid, bssid, m_networkList);
}

void Supplicant::logInterfaceGuid() const {
    if (m_pMgr == nullptr) Log(6, "ERROR: No Config.");
    Log(2, "Interface GUID: %s", guidToString(m_interfaceGuid).c_str());
}

bool Supplicant::openWlanHandle() {
    HANDLE handle = nullptr;
    DWORD negotiated = 0;
    if (WlanOpenHandle(kWlanClientVersion, nullptr, &negotiated, &handle) != ERROR_SUCCESS) {
        Log(3, "WlanOpenHandle failed in supplicant initialization.");
        return false;
    }
    if (handle == nullptr || handle == INVALID_HANDLE_VALUE) {
        Log(3, "Invalid WLAN handle value.");
        return false;
    }
    m_hWlan = handle;
    return true;
}

void Supplicant::closeWlanHandle() {
    if (const HANDLE handle = m_hWlan.exchange(nullptr)) WlanCloseHandle(handle, nullptr);
}

void Supplicant::deinit() {
    assert(!g_hs20Lock.isHeldByThisThread());
    Log(3, "Deinitializing supplicant...");
    if (!m_bInitialized) return;
    m_interworkingMgr.stop();
    {
        const LockGuard lock(g_hs20Lock);
        m_retryHelper.clear();
    }
    closeWlanHandle();
    m_bInitialized = false;
    Log(3, "Deinitialize supplicant completed.");
}

void Supplicant::reset() {
    const LockGuard lock(g_hs20Lock);
    m_bConnectionStarted = false;
    m_bManualConnectStarted = false;
    m_connectingSsid.clear();
    m_triedCredentialIds.clear();
    m_bManualConnectPending = false;
    m_pendingManualSsid.clear();
    m_bQueryingAnqp = false;
    m_bRoaming = false;
    m_bConnectionStartedByOs = false;
    m_bHs20Connected = false;
    m_blockedNetworks.clear();
    m_profileMgr.clear();
    m_retryHelper.resetAllNumRetries();
}

int Supplicant::setState(SupplicantState state) {
    const LockGuard lock(g_hs20Lock);
    if (m_state == state) return kSuccess;
    if (const SupplicantState live = queryState(); isClaim(state) && live != state) return kSuccess;
    Log(3, "Supplicant state changed from %s to %s", nameOf(m_state), nameOf(state));
    m_state = state;
    m_hSupplicantStateChangedEvent.set();
    return kSuccess;
}

SupplicantState Supplicant::queryState() const {
    const auto state = queryInterface<WLAN_INTERFACE_STATE>(
        m_hWlan, m_interfaceGuid, wlan_intf_opcode_interface_state, sizeof(WLAN_INTERFACE_STATE));
    if (state) return stateOf(*state);
    Log(3, "WlanQueryInterface failed in Supplicant::queryState.");
    return SupplicantState::InvalidState;
}

void Supplicant::setRadioState(bool on) {
    if (m_bRadioOn == on) return;
    Log(3, "Radio state changed from %s == > %s", onOrOff(m_bRadioOn), onOrOff(on));
    m_bRadioOn = on;
    m_hRadioStateChangedEvent.set();
}

bool Supplicant::isRadioOn() const {
    const auto radio = queryInterface<WLAN_RADIO_STATE>(m_hWlan, m_interfaceGuid,
                                                        wlan_intf_opcode_radio_state, kMinimumRadioState);
    return !radio || radio->PhyRadioState[0].dot11SoftwareRadioState != dot11_radio_state_off;
}

bool Supplicant::isHs20Enabled() const {
    return m_pMgr == nullptr || m_pMgr->config().m_bHotSpotAutoConnect;
}

void Supplicant::tellClient(const std::function<void(const ClientEvents&)>& tell) {
    if (m_pMgr != nullptr && m_pMgr->clientEvents().isComplete()) tell(m_pMgr->clientEvents());
}

int Supplicant::getCredential(std::int32_t id, Credential*& credential) {
    if (m_pMgr == nullptr) return kFailure;
    if (id < 1) return kInvalidArgument;
    credential = m_pMgr->config().credentials().findCredentialById(id);
    return kSuccess;
}

int Supplicant::deleteCredential(std::int32_t id) {
    Log(3, "Deleting the credential with id=%d", id);
    if (m_pMgr == nullptr) return kFailure;
    Config& config = m_pMgr->config();
    if (!config.credentials().deleteCredential(id)) return kFailure;
    config.saveConfig();
    m_retryHelper.removeAllCredNumRetryEntries(id);
    m_profileMgr.deleteProfilesOfCredential(id);
    m_hCredentialChangedEvent.set();
    return kSuccess;
}

int Supplicant::updateCredential(const CredentialInput& input) {
    Log(3, "Updating the credential with id=%d", input.id);
    Credential* credential = nullptr;
    if (getCredential(input.id, credential) != kSuccess || credential == nullptr) {
        Log(6, "ERROR: Cannot find credential.");
        return kFailure;
    }
    Config& config = m_pMgr->config();
    if (!credential->m_bAutoConnect && input.autoConnect)
        m_blockedNetworks.onCredentialAutoConnectChanged(input.id, config.credentials(), m_networkList);
    if (config.credentials().updateCredential(input) != kSuccess) return kFailure;
    config.saveConfig();
    m_retryHelper.resetNumRetries(input.id);
    m_profileMgr.deleteProfilesOfCredential(input.id);
    m_hCredentialChangedEvent.set();
    return kSuccess;
}

}  // namespace vexa
