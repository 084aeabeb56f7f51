#pragma once

#include <array>
#include <atomic>
#include <cstdint>

#include "base/NetworkListLock.h"
#include "config/Credential.h"
#include "platform/Event.h"
#include "platform/WlanApi.h"

namespace vexa {

class SupplicantMgr;

enum class SupplicantState : std::int32_t {
    InvalidState,
    Initialized,
    Connecting,
    Connected,
    Disconnecting,
    Disconnected,
    InterfaceDisabled,
    Scanning,
    Authenticating,
    Associating,
    Associated,
    Disassociating,
    Auth4WayHandshake,
    GroupHandshake,
};

const char* nameOf(SupplicantState state);

/// All that belongs to one adapter. Made and ended by SupplicantMgr; notification and command threads come
/// here with a reference that keeps the object alive, also beyond deinit(): its events and its handle stay
/// members to the end.
class Supplicant {
public:
    Supplicant(const GUID& interfaceGuid, SupplicantMgr* mgr);
    ~Supplicant();
    Supplicant(const Supplicant&) = delete;
    Supplicant& operator=(const Supplicant&) = delete;

    /// Always 0; the outcome is in isInitialized(). A failure releases what was made before it.
    int init() EXCLUDES(g_hs20Lock);
    /// REQUIRES: the network list lock not held.
    void deinit() EXCLUDES(g_hs20Lock);
    /// Back to a clean start when the adapter comes back, without losing the object.
    void reset() EXCLUDES(g_hs20Lock);
    bool isInitialized() const { return m_bInitialized; }

    /// The cached state. Claims about the WLAN service are only taken over once it agrees. Always 0.
    int setState(SupplicantState state);
    /// The live state. InvalidState if it can't be told.
    SupplicantState queryState() const;

    /// The cached radio state, and the live one; true also if that can't be told.
    void setRadioState(bool on);
    bool isRadioOn() const;

    /// Whether the user has the hotspot function switched on.
    bool isHs20Enabled() const;

    /// 0; 1 if the adapters can't be listed, 2 if this one is not among them.
    int queryMacAddress();
    /// Whether the adapter has a DNS server. Always 0; no access if it can't be told.
    int queryInternetAccess(bool& hasAccess) const;

    /// 1 without a manager, 4 for an id below 1; else 0, with `credential` null if there is none.
    int getCredential(std::int32_t id, Credential*& credential) REQUIRES(g_hs20Lock);
    /// Change a stored credential, save, and wake the connecting thread. 0, 1 or 4.
    int deleteCredential(std::int32_t id) REQUIRES(g_hs20Lock);
    int updateCredential(const CredentialInput& input) REQUIRES(g_hs20Lock);

    const GUID m_interfaceGuid;
    SupplicantMgr* const m_pMgr;  // not owned; outlives all supplicants

    platform::Event m_hSupplicantStateChangedEvent{platform::Reset::Auto, "supplicant state changed"};
    platform::Event m_hConnectionCompletedEvent{platform::Reset::Auto, "connection completed"};
    platform::Event m_hRadioStateChangedEvent{platform::Reset::Auto, "radio state changed"};
    platform::Event m_hHs20NetworkChangedEvent{platform::Reset::Auto, "HS20 network list changed"};
    platform::Event m_hCredentialChangedEvent{platform::Reset::Auto, "credential changed"};
    platform::Event m_hEnableHs20Event{platform::Reset::Auto, "HS20 enabled or disabled"};
    platform::Event m_hAnqpInfoReadyEvent{platform::Reset::Auto, "ANQP info ready"};

    /// Between roaming start and end.
    std::atomic<bool> m_bRoaming{false};

private:
    const char* initSteps();
    void logInterfaceGuid() const;
    bool openWlanHandle();
    void closeWlanHandle();

    std::atomic<bool> m_bInitialized{false};
    std::atomic<bool> m_bRadioOn{false};
    std::array<std::uint8_t, 6> m_macAddress{};
    std::atomic<std::uint32_t> m_ifIndex{0};
    std::atomic<HANDLE> m_hWlan{nullptr};
    SupplicantState m_state GUARDED_BY(g_hs20Lock) = SupplicantState::InvalidState;
};

}  // namespace vexa
