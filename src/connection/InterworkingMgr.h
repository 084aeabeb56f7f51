#pragma once

#include <atomic>
#include <string>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/ResultCodes.h"
#include "platform/Event.h"
#include "platform/Thread.h"

namespace vexa {

struct Credential;
struct NetworkProfile;
class Hs20Network;
class Supplicant;
struct EngineState;

/// A network and the credential to join it with; both null if there is none.
struct NetworkChoice {
    Hs20Network* network = nullptr;
    const Credential* credential = nullptr;
};

/// The network connecting thread: the only place where the system decides by itself to connect. It sleeps on
/// eight events, 10 s at most, and then runs one round: a chain of gates, each of which can end the round
/// with its line in the log, and at its end one attempt to connect.
class InterworkingMgr {
public:
    InterworkingMgr(Supplicant& supplicant, EngineState& engine)
        : m_supplicant(supplicant), m_engine(engine) {}
    ~InterworkingMgr();
    InterworkingMgr(const InterworkingMgr&) = delete;
    InterworkingMgr& operator=(const InterworkingMgr&) = delete;

    /// Starts the thread. kFailure if it can't be created.
    ResultCode init();

    /// Ends the thread, within 10 s. REQUIRES: the network list lock not held.
    void stop();

    /// For an owner that is destroyed without an orderly end.
    void stopIfInited();

    /// Whether stop() gave up waiting. The thread then ends by itself after its sleep, and the Supplicant
    /// must live until the process ends.
    bool isThreadLate() const { return m_isThreadLate; }

private:
    void runNetworkingLoop();
    int waitForWork();
    void runRound();
    bool passesGates();
    void connect();

    /// One attempt: chooses, finds or builds the profile, and asks for the connection.
    ConnectOutcome connectNetwork() EXCLUDES(g_hs20Lock);
    NetworkChoice findBestMatchBssAndCredential() REQUIRES(g_hs20Lock);
    const Credential* selectCredential(const Hs20Network& network,
                                       const std::vector<const Credential*>& found) REQUIRES(g_hs20Lock);
    NetworkProfile* profileFor(const NetworkChoice& choice, const std::wstring& name) REQUIRES(g_hs20Lock);
    NetworkProfile* reusableProfile(const NetworkChoice& choice, const std::wstring& name)
        REQUIRES(g_hs20Lock);

    ResultCode countAndConnect(const NetworkChoice& choice, const NetworkProfile& profile)
        REQUIRES(g_hs20Lock);

    Supplicant& m_supplicant;
    EngineState& m_engine;
    std::atomic<bool> m_bInited{false};
    std::atomic<bool> m_bTerminate{false};
    std::atomic<bool> m_isThreadLate{false};
    platform::Event m_hTerminationEvent{platform::Reset::Manual, "termination"};
    platform::Thread m_thread;
};

}  // namespace vexa
