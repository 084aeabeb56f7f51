#include <array>

#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"
#include "platform/Session.h"

namespace vexa {

namespace {

using platform::LockGuard;

constexpr std::size_t kSessionPayload = 8;

// In milliseconds. Exactly at the first the disconnection is still the user's, exactly at the second it
// counts again.
constexpr std::uint32_t kLongDisconnected = 1000;
constexpr std::uint32_t kJustToggled = 2000;

constexpr std::array<const char*, 10> kSessionTexts = {
    nullptr,
    "[Session] A session was connected to the console session.",
    "[Session] A session was disconnected from the console session.",
    "[Session] A session was connected to the remote session.",
    "[Session] A session was disconnected from the remote session.",
    "[Session] A user has logged on to the session.",
    "[Session] A user has logged off of the session.",
    "[Session] A session has been locked.",
    "[Session] A session has been unlocked.",
    "[Session] A session has changed its remote controlled status.",
};

const char* sessionText(std::uint32_t eventType) {
    const bool isKnown = eventType > 0 && eventType < kSessionTexts.size();
    return isKnown ? kSessionTexts[eventType] : "[Session] Unknown event type.";
}

}  // namespace

// Whatever the change: retries begin anew, and what was blocked by the way is open again.
ResultCode Supplicant::onSessionChanged(Bytes payload) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "### [Session] IHV reports session changed. ###");
    if (payload.size() < kSessionPayload) return kFailure;
    const std::uint32_t eventType = numberAt(payload, 0);
    Log(3, "\tEventType=%d, sessionId=%d", static_cast<int>(eventType),
        static_cast<int>(numberAt(payload, 4)));
    Log(3, "%s", sessionText(eventType));
    m_engine.m_retryHelper.resetAllNumRetries();
    m_engine.m_blockedNetworks.unblockRecentNetworks();
    return kSuccess;
}

// Why a report of the IHV is no act of the user against this network; null if it may be one.
const char* Supplicant::reasonNotToBlock() const {
    if (!platform::isSessionActive())
        return "Current session is not active, don't update the blocked network list.";
    if (!m_bRadioOn) return "Radio turned off, don't update the blocked network list.";
    if (!isHs20Enabled()) return "HS20 not enabled, don't update the blocked network list.";
    if (m_bManualConnectStarted)
        return "Manually connect to HS20 network started, this network maybe disconnected for we are going to connect another network.";
    if (m_bConnectionStartedByOs)
        return "Connection started by OS, HS20 network may be disconected,we should not block any HS20 network from auto connecting in this case.";
    const ConnectionRecord* const last = m_history.last();
    if (last == nullptr) return "No last connection history.";
    Log(3,
        last->m_bDisconnectedTimeValid ? "Connection disconnected earlier." : "Connection still in active.");
    if (last->m_bDisconnectedTimeValid && millisecondsSince(last->m_disconnectedTime) > kLongDisconnected)
        return "This network has been disconnected for a long time,not possible that user just disconnect from it.";
    return nullptr;
}

ResultCode Supplicant::onUserDisconnected(Bytes payload) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "### IHV reports HS20 network has been disconnected manually by user. ###");
    Log(3, "\tQueried supplicant state=%s", nameOf(queryState()));
    if (const char* const reason = reasonNotToBlock()) {
        Log(3, "%s", reason);
        return kSuccess;
    }
    Log(3, "Check if the active connection is the connection to be disconnected.");
    if (payload.size() < kBssRecordSize) return kFailure;
    const Hs20BssRecord record = parseBssRecord(payload);
    if (record.isHs20 == 0) {
        Log(6, "ERROR: Not a HS20 network.");
        return kFailure;
    }
    const std::string active(bytesOf(m_history.last()->m_ssid));
    if (!record.ssid.starts_with(active)) {
        Log(3, "Windows disconnected network with ssid=%s while the active connection with ssid=%s",
            record.ssid.c_str(), active.c_str());
        return kSuccess;
    }
    const std::uint32_t elapsed = millisecondsSince(m_lastHs20ToggleTime);
    if (elapsed < kJustToggled) {
        Log(3,
            "Skip blocking the network with ssid=%s since we just toggled the enable/disable hs20, millisecond elapsed=%d",
            record.ssid.c_str(), static_cast<int>(elapsed));
        return kSuccess;
    }
    m_engine.m_blockedNetworks.blockNetwork(record.ssid, false);
    return kSuccess;
}

}  // namespace vexa
