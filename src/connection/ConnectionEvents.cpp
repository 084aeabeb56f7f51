#include "base/DiagnosticLog.h"
#include "config/ResultCodes.h"
#include "connection/Supplicant.h"

namespace vexa {

namespace {

using platform::LockGuard;

const char* onOrOff(bool on) {
    return on ? "ON" : "OFF";
}

}  // namespace

// A radio change wipes the slate, in both directions.
int Supplicant::onRadioStateChanged(const WLAN_PHY_RADIO_STATE* data) {
    if (data == nullptr) return kInvalidArgument;
    const LockGuard lock(g_hs20Lock);
    const bool isOn = data->dot11SoftwareRadioState == dot11_radio_state_on;
    if (isOn == m_bRadioOn) {
        Log(3, "Supplicant already set radio state to %s while requested to set radio state to %s",
            onOrOff(isOn), onOrOff(isOn));
        return kSuccess;
    }
    setRadioState(isOn);
    Log(3, "Supplicant state=%s when radio state changed.", nameOf(m_state));
    setState(SupplicantState::Disconnected);
    m_bConnectionStarted = false;
    m_retryHelper.resetAllNumRetries();
    sendNetworkList();
    return kSuccess;
}

}  // namespace vexa
