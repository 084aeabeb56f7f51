#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "base/StandardOutput.h"
#include "base/WlanMemory.h"
#include "channel/StyledText.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::size_t kSupplicantStateSize = 8;

}  // namespace

void SAHotSpotPortlink::SendRadioState() {
    const bool isOn = isSoftwareRadioOn(m_hClientHandle.get(), m_interfaceGuid.get());
    SendData(toStyledText(Json::Value(isOn)), contract::kGetRadio);
}

void SAHotSpotPortlink::SendCardState() {
    SendData("", m_bCardIn ? contract::kCardPlugIn : contract::kCardPlugOut);
}

void SAHotSpotPortlink::SendInternetAccess() {
    const platform::LockGuard lock(g_hs20Lock);
    Log(3, "Send connection status to vexa");
    const auto supplicant = hotspotSupplicant(*this);
    if (!supplicant) return;
    const bool hasAccess = supplicant->getConnectedBss(false) != nullptr && supplicant->hasInternetAccess();
    SendData(toStyledText(Json::Value(hasAccess)), contract::kGetIsInternetAccess);
}

void SAHotSpotPortlink::SendConnectionResult(const ConnectionResult& result) {
    Log(3, "Send connection result to vexa.");
    const int outcome = result.m_result == ConnectionResult::kSucceeded ? 1 : 0;
    SendData(toStyledText(Json::Value(outcome)), contract::kConnectDisconnect);
}

void SAHotSpotPortlink::SendDetectedHotspot() {
    Log(3, "Detected HS20 networks.");
    SendData(toStyledText(Json::Value()), contract::kDetectedHotspot);
}

void SAHotSpotPortlink::SendSupplicantState(Bytes payload) {
    if (payload.size() < kSupplicantStateSize) return;
    const std::uint32_t current = numberAt(payload, 0);
    const std::uint32_t previous = numberAt(payload, 4);
    printToStandardOutput("PreviousState=%d \n", static_cast<int>(previous));
    printToStandardOutput("CurrentState=%d \n", static_cast<int>(current));
    Json::Value states;
    states["PreviousState"] = static_cast<std::int32_t>(previous);
    states["CurrentState"] = static_cast<std::int32_t>(current);
    SendData(toStyledText(states), contract::kSupplicantStateChange);
}

}  // namespace vexa
