#include "connection/Supplicant.h"

#include <cassert>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "config/ResultCodes.h"
#include "connection/SupplicantMgr.h"
#include "platform/Guid.h"

namespace vexa {

namespace {

using platform::LockGuard;

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

Supplicant::Supplicant(const GUID& interfaceGuid, SupplicantMgr* mgr)
    : m_pMgr(mgr), m_lastHs20ToggleTime(getTimeValue()), m_wlan(interfaceGuid) {
    m_lastHs20ToggleTime.seconds -= kLongBeforeStart;
}

Supplicant::~Supplicant() {
    m_interworkingMgr.stopIfInited();
}

int Supplicant::init() {
    Log(2, "Initializing supplicant...");
    if (const char* const error = initSteps()) {
        Log(6, "%s", error);
        Log(6, "ERROR: Initiailize supplicant failed.");
        deinit();
        m_interworkingMgr.stop();
        m_wlan.close();
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
    if (!m_wlan.open()) return "ERROR: Open wlan handle failed.";
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
    const auto connection = m_wlan.queryCurrentConnection(false);
    if (!connection) return;
    const LockGuard lock(g_hs20Lock);
    m_history.addConnection(connection->ssid, connection->bssid, m_networkList);
}

void Supplicant::logInterfaceGuid() const {
    if (m_pMgr == nullptr) Log(6, "ERROR: No Config.");
    Log(2, "Interface GUID: %s", guidToString(m_wlan.guid()).c_str());
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
    m_wlan.close();
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

void Supplicant::setRadioState(bool on) {
    if (m_bRadioOn == on) return;
    Log(3, "Radio state changed from %s == > %s", onOrOff(m_bRadioOn), onOrOff(on));
    m_bRadioOn = on;
    m_hRadioStateChangedEvent.set();
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
