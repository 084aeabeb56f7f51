#include "connection/InterworkingMgr.h"

#include <array>
#include <cassert>
#include <chrono>

#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "connection/EngineState.h"
#include "connection/Supplicant.h"
#include "platform/Clock.h"
#include "platform/Session.h"
#include "text/OutOfMemory.h"

namespace vexa {

namespace {

using platform::LockGuard;
using namespace std::chrono_literals;

constexpr auto kRoundLimit = 10000ms;
constexpr auto kRadioPause = 10000ms;
constexpr auto kSessionPause = 5000ms;
constexpr auto kStopLimit = 10000ms;

/// What the connecting thread waits for, in order of priority.
struct Wake {
    platform::Event EngineState::*event;  // null: the thread's own
    const char* line;
    platform::Duration pause;
};

constexpr std::array<Wake, 8> kWakes = {{
    {nullptr, "Termination event signaled.", 0ms},
    {&EngineState::m_hEnableHs20Event, "Enable/disable HS20 event signaled.", 0ms},
    {&EngineState::m_hHs20NetworkChangedEvent, "HS20 network list changed event signaled.", 0ms},
    {&EngineState::m_hCredentialChangedEvent, "Credential changed event signaled.", 0ms},
    {&EngineState::m_hAnqpInfoReadyEvent, "ANQP info ready event signaled.", 0ms},
    {&EngineState::m_hConnectionCompletedEvent, "Connection operation completed event signaled.", 0ms},
    {&EngineState::m_hSupplicantStateChangedEvent, "Supplicant state changed event signaled.", 0ms},
    {&EngineState::m_hRadioStateChangedEvent, "Radio state changed event signaled.", kRadioPause},
}};

/// What the gates look at.
struct Parts {
    Supplicant& supplicant;
    EngineState& engine;
};

bool isHs20Off(const Parts& parts) {
    return !parts.supplicant.isHs20Enabled();
}

bool isRadioOff(const Parts& parts) {
    return !parts.supplicant.isRadioOn();
}

bool isBusy(const Parts& parts) {
    const SupplicantState state = parts.supplicant.queryState();
    if (state == SupplicantState::Disconnected) return false;
    Log(3, "Supplicant not in disconnected state, skip this round of network connecting.");
    Log(3, "Queried supplicant state=%s", nameOf(state));
    return true;
}

bool isConnecting(const Parts& parts) {
    return parts.engine.m_bConnectionStarted;
}

bool hasNoNetwork(const Parts& parts) {
    const LockGuard lock(g_hs20Lock);
    return parts.engine.m_networkList.size() == 0;
}

bool hasNoCredential(const Parts& parts) {
    const LockGuard lock(g_hs20Lock);
    return parts.engine.m_config.credentials().size() == 0;
}

bool isQueryingAnqp(const Parts& parts) {
    return parts.engine.m_bQueryingAnqp;
}

bool lacksAnqpInfo(const Parts& parts) {
    if (!parts.supplicant.hasUnfetchedAnqpInfo()) return false;
    Log(3,
        "Not all HS20 network ANQP info fetched, we will query the ANQP info first before auto connecting.");
    parts.supplicant.queryHs20NetworkAnqpInfo();
    return true;
}

bool isSessionAway(const Parts& /*parts*/) {
    if (platform::isSessionActive()) return false;
    Log(3, "Current session is not active, sleep for a while and continue.");
    platform::sleepFor(kSessionPause);
    return true;
}

/// Ends the round if it holds. A gate with more to say than one line says it itself.
struct Gate {
    bool (*holds)(const Parts& parts);
    const char* line;
};

constexpr std::array<Gate, 9> kGates = {{
    {isHs20Off, "HS20 functionality not enabled, wait for user turning it on."},
    {isRadioOff, "Radio turned off, wait it be turned on."},
    {isBusy, nullptr},
    {isConnecting, "Connection already started, wait for connection operation completed event signaled."},
    {hasNoNetwork, "No HS20 BSS, wait for HS20 network list change."},
    {hasNoCredential, "No credential, wait for user to add credential."},
    {isQueryingAnqp, "We are querying the HS20 network ANQP info, wait."},
    {lacksAnqpInfo, nullptr},
    {isSessionAway, nullptr},
}};

}  // namespace

InterworkingMgr::~InterworkingMgr() {
    stopIfInited();
}

void InterworkingMgr::stopIfInited() {
    if (!m_bInited) return;
    Log(2, "InterworkingMgr not deinited!");
    stop();
}

ResultCode InterworkingMgr::init() {
    Log(2, "\tInitializing InterworkingMgr.");
    m_bTerminate = false;
    m_hTerminationEvent.reset();
    Log(2, "\t\tCreating InterworkingMgr working thread.");
    if (!m_thread.start("connecting", [this] { runNetworkingLoop(); })) {
        Log(6, "ERROR: Create network connecting thread failed.");
        return kFailure;
    }
    m_bInited = true;
    return kSuccess;
}

void InterworkingMgr::stop() {
    assert(!g_hs20Lock.isHeldByThisThread());
    m_bTerminate = true;
    m_hTerminationEvent.set();
    if (m_thread.isStarted()) {
        if (!m_thread.join(kStopLimit)) {
            Log(6, "Time out when waiting for network connecting thread termination.");
            m_isThreadLate = true;
            m_thread.detach();
        } else {
            m_thread = platform::Thread();
        }
    }
    m_bInited = false;
}

void InterworkingMgr::runNetworkingLoop() {
    while (!m_bTerminate) {
        Log(3, "\n\n#####Start new round of network connecting...#####");
        if (waitForWork() == 0) break;
        if (m_bTerminate) break;
        if (!withinMemory([this] { runRound(); }))
            Log(6, "ERROR: Out of memory, this round of network connecting has ended early.");
    }
    Log(2, "The NetworkingMgr thread is to be terminated...");
}

int InterworkingMgr::waitForWork() {
    std::array<platform::Event*, kWakes.size()> events{};
    for (std::size_t i = 0; i < kWakes.size(); ++i)
        events[i] = kWakes[i].event == nullptr ? &m_hTerminationEvent : &(m_engine.*kWakes[i].event);
    const int woken = waitForAny(events, kRoundLimit);
    if (woken == platform::kTimedOut) {
        Log(3, "Timeout happens in the network connecting thread.");
        return woken;
    }
    const Wake& wake = kWakes[static_cast<std::size_t>(woken)];
    Log(3, "%s", wake.line);
    if (wake.pause > 0ms) platform::sleepFor(wake.pause);
    return woken;
}

void InterworkingMgr::runRound() {
    if (passesGates()) connect();
}

bool InterworkingMgr::passesGates() {
    for (const Gate& gate : kGates) {
        if (!gate.holds({m_supplicant, m_engine})) continue;
        if (gate.line != nullptr) Log(3, "%s", gate.line);
        return false;
    }
    return true;
}

void InterworkingMgr::connect() {
    switch (connectNetwork()) {
        case kConnectFailed:
            return Log(6, "connectNetwork returns error.");
        case kConnectStarted:
            return Log(3, "connectNetwork returns with op succeeded.");
        case kConnectNothingLeft:
            return Log(3, "connectNetwork returns with op cancelled.");
        case kNetworkGone:
            return Log(3, "connectNetwork returns with failure.");
    }
}

}  // namespace vexa
