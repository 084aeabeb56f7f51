#pragma once

#include <atomic>

#include "base/NetworkListLock.h"
#include "config/Config.h"
#include "connection/BlockedNetworkList.h"
#include "connection/NetworkProfileMgr.h"
#include "connection/NetworkRetryHelper.h"
#include "hotspot/Hs20NetworkList.h"
#include "platform/Event.h"

namespace vexa {

/// What a Supplicant and its connecting thread both work on.
struct EngineState {
    explicit EngineState(Config& config) : m_config(config) {}

    Config& m_config;  // of all supplicants

    Hs20NetworkList m_networkList GUARDED_BY(g_hs20Lock);
    NetworkProfileMgr m_profileMgr GUARDED_BY(g_hs20Lock);
    NetworkRetryHelper m_retryHelper GUARDED_BY(g_hs20Lock);
    BlockedNetworkList m_blockedNetworks GUARDED_BY(g_hs20Lock);

    // Written under the lock, read also without it.

    std::atomic<bool> m_bConnectionStarted{false};  // a connection that this program asked for is under way
    std::atomic<bool> m_bQueryingAnqp{false};

    // These wake the connecting thread.

    platform::Event m_hSupplicantStateChangedEvent{platform::Reset::Auto, "supplicant state changed"};
    platform::Event m_hConnectionCompletedEvent{platform::Reset::Auto, "connection completed"};
    platform::Event m_hRadioStateChangedEvent{platform::Reset::Auto, "radio state changed"};
    platform::Event m_hHs20NetworkChangedEvent{platform::Reset::Auto, "HS20 network list changed"};
    platform::Event m_hCredentialChangedEvent{platform::Reset::Auto, "credential changed"};
    platform::Event m_hEnableHs20Event{platform::Reset::Auto, "HS20 enabled or disabled"};
    platform::Event m_hAnqpInfoReadyEvent{platform::Reset::Auto, "ANQP info ready"};
};

}  // namespace vexa
