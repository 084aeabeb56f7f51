#include "connection/Supplicant.h"

#include <cassert>
#include <tuple>

#include "base/DiagnosticLog.h"
#include "connection/SupplicantMgr.h"
#include "platform/Guid.h"
#include "text/OutOfMemory.h"

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

Supplicant::Supplicant(const GUID& interfaceGuid, SupplicantMgr& mgr)
    : m_mgr(mgr), m_engine(mgr.config()), m_wlan(interfaceGuid), m_lastHs20ToggleTime(getTimeValue()) {
    m_lastHs20ToggleTime.seconds -= kLongBeforeStart;
}

Supplicant::~Supplicant() {
    m_interworkingMgr.stopIfInited();
}

void Supplicant::init() {
    Log(2, "Initializing supplicant...");
    const char* error = "ERROR: Out of memory.";
    std::ignore = withinMemory([&] { error = initSteps(); });
    if (error != nullptr) {
        Log(6, "%s", error);
        Log(6, "ERROR: Initiailize supplicant failed.");
        deinit();
        m_interworkingMgr.stop();
        m_wlan.close();
        return;
    }
    m_bInitialized = true;
    Log(3, "Initialize supplicant succeeded.");
}

// The line of the step that failed; null if none did.
const char* Supplicant::initSteps() {
    Log(2, "Interface GUID: %s", guidToString(m_wlan.guid()).c_str());
    if (!m_ip.find(m_wlan.guid())) return "ERROR: Query MAC address failed.";
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
    m_history.addConnection(connection->ssid, connection->bssid, m_engine.m_networkList);
}

void Supplicant::deinit() {
    assert(!g_hs20Lock.isHeldByThisThread());
    Log(3, "Deinitializing supplicant...");
    if (!m_bInitialized) return;
    m_interworkingMgr.stop();
    {
        const LockGuard lock(g_hs20Lock);
        m_engine.m_retryHelper.clear();
    }
    m_wlan.close();
    m_bInitialized = false;
    Log(3, "Deinitialize supplicant completed.");
}

void Supplicant::reset() {
    const LockGuard lock(g_hs20Lock);
    m_engine.m_bConnectionStarted = false;
    m_bManualConnectStarted = false;
    m_connectingSsid.clear();
    m_triedCredentialIds.clear();
    m_bManualConnectPending = false;
    m_pendingManualSsid.clear();
    m_engine.m_bQueryingAnqp = false;
    m_bRoaming = false;
    m_bConnectionStartedByOs = false;
    m_bHs20Connected = false;
    m_engine.m_blockedNetworks.clear();
    m_engine.m_profileMgr.clear();
    m_engine.m_retryHelper.resetAllNumRetries();
}

void Supplicant::setState(SupplicantState state) {
    const LockGuard lock(g_hs20Lock);
    if (m_state == state) return;
    if (const SupplicantState live = queryState(); isClaim(state) && live != state) return;
    Log(3, "Supplicant state changed from %s to %s", nameOf(m_state), nameOf(state));
    m_state = state;
    m_engine.m_hSupplicantStateChangedEvent.set();
}

void Supplicant::setRadioState(bool on) {
    if (m_bRadioOn == on) return;
    Log(3, "Radio state changed from %s == > %s", onOrOff(m_bRadioOn), onOrOff(on));
    m_bRadioOn = on;
    m_engine.m_hRadioStateChangedEvent.set();
}

bool Supplicant::isHs20Enabled() const {
    return m_engine.m_config.m_bHotSpotAutoConnect;
}

void Supplicant::setHs20Enabled(bool enable) {
    if (isHs20Enabled() == enable) return;
    m_lastHs20ToggleTime = getTimeValue();
    m_engine.m_config.m_bHotSpotAutoConnect = enable;
    m_engine.m_retryHelper.resetAllNumRetries();
    m_engine.m_hEnableHs20Event.set();
    sendNetworkList();
    if (enable) return;
    Log(3,
        "STA is in connected state when user turns of HS20,trying to disconnect from any connected HS20 network.");
    if (m_bHs20Connected) disconnectedBSS(Leave::Hs20);
}

void Supplicant::tellClient(const std::function<void(const ClientEvents&)>& tell) {
    if (m_mgr.clientEvents().isComplete()) tell(m_mgr.clientEvents());
}

void Supplicant::sendConnectionResult(std::uint32_t outcome) {
    tellClient([&](const ClientEvents& events) { events.sendConnectionResult({.m_result = outcome}); });
}

}  // namespace vexa
