#pragma once

#include <array>
#include <atomic>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "base/NetworkListLock.h"
#include "base/TimeValue.h"
#include "config/Credential.h"
#include "connection/BlockedNetworkList.h"
#include "connection/ClientEvents.h"
#include "connection/ConnectionHistory.h"
#include "connection/InterworkingMgr.h"
#include "connection/NetworkProfileMgr.h"
#include "connection/NetworkRetryHelper.h"
#include "connection/SupplicantState.h"
#include "connection/WlanInterface.h"
#include "hotspot/Hs20NetworkList.h"
#include "platform/Event.h"
#include "platform/WlanApi.h"

namespace vexa {

class SupplicantMgr;

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
    const GUID& interfaceGuid() const { return m_wlan.guid(); }

    /// The cached state. Claims about the WLAN service are only taken over once it agrees. Always 0.
    int setState(SupplicantState state);
    /// The live state. InvalidState if it can't be told.
    SupplicantState queryState() const { return m_wlan.queryState(); }

    /// The cached radio state, and the live one; true also if that can't be told.
    void setRadioState(bool on);
    bool isRadioOn() const { return m_wlan.isRadioOn(); }

    /// Whether the user has the hotspot function switched on.
    bool isHs20Enabled() const;

    /// 0; 1 if the adapters can't be listed, 2 if this one is not among them.
    int queryMacAddress();
    /// Whether the adapter has a DNS server. Always 0; no access if it can't be told.
    int queryInternetAccess(bool& hasAccess) const;

    /// The network of the WLAN service's current connection; null if there is none in the list. Good while
    /// the lock is held.
    Hs20Network* getConnectedBss(bool includeConnecting) const REQUIRES(g_hs20Lock);

    /// Takes over a report of the networks in range, fetches what ANQP has found out about each, and tells
    /// the client. kInvalidArgument without records.
    int updateHs20NetworkList(const std::vector<Hs20BssRecord>& records);
    bool hasUnfetchedAnqpInfo() const;
    void sendNetworkList() REQUIRES(g_hs20Lock);

    /// Asks the WLAN service to end its connection.
    DWORD requestDisconnect() const { return m_wlan.disconnect(); }

    /// Requests to the hotspot module: start the ANQP queries of all networks, read the networks in range,
    /// read what is known of one. kSuccess or kFailure.
    int queryHs20NetworkAnqpInfo();
    int getHs20BssListFromIHV();
    int fetchBssAnqpInfo(Hs20Network* network) REQUIRES(g_hs20Lock);

    /// Messages of the hotspot module.
    int onNetworkListChanged(Bytes payload);
    int onAnqpInfoChanged(Bytes payload);
    void onAnqpQueryCompleted();
    int onUserDisconnected(Bytes payload);
    int onSessionChanged(Bytes payload);

    /// Notifications of the WLAN service. Null data changes nothing but what every call does.
    int onConnectionStart(const WLAN_CONNECTION_NOTIFICATION_DATA* data);
    int onConnectionComplete(const WLAN_CONNECTION_NOTIFICATION_DATA* data);
    int onDisconnected(const WLAN_CONNECTION_NOTIFICATION_DATA* data);
    int onRadioStateChanged(const WLAN_PHY_RADIO_STATE* data);

    /// Asks for a connection; also kSuccess where none is needed. kInvalidArgument for null.
    int connectToNetwork(const Hs20Network* network, const NetworkProfile* profile) REQUIRES(g_hs20Lock);

    /// The user wants this network: at once, or when the running attempt has ended. kSuccess if the
    /// connection was started or postponed; kFailure; kInvalidArgument without an SSID.
    int connectBss(std::string_view ssid);

    /// The user leaves the network, which auto-connect then stays away from if `blockNetwork`. kFailure if
    /// `requireHs20` and none of the list is connected, or the request failed.
    int disconnectedBSS(bool blockNetwork, bool requireHs20);

    /// 1 without a manager, 4 for an id below 1; else 0, with `credential` null if there is none.
    int getCredential(std::int32_t id, Credential*& credential) REQUIRES(g_hs20Lock);
    /// Change a stored credential, save, and wake the connecting thread. 0, 1 or 4.
    int deleteCredential(std::int32_t id) REQUIRES(g_hs20Lock);
    int updateCredential(const CredentialInput& input) REQUIRES(g_hs20Lock);

    SupplicantMgr* const m_pMgr;  // not owned; outlives all supplicants

    platform::Event m_hSupplicantStateChangedEvent{platform::Reset::Auto, "supplicant state changed"};
    platform::Event m_hConnectionCompletedEvent{platform::Reset::Auto, "connection completed"};
    platform::Event m_hRadioStateChangedEvent{platform::Reset::Auto, "radio state changed"};
    platform::Event m_hHs20NetworkChangedEvent{platform::Reset::Auto, "HS20 network list changed"};
    platform::Event m_hCredentialChangedEvent{platform::Reset::Auto, "credential changed"};
    platform::Event m_hEnableHs20Event{platform::Reset::Auto, "HS20 enabled or disabled"};
    platform::Event m_hAnqpInfoReadyEvent{platform::Reset::Auto, "ANQP info ready"};

    ConnectionHistory m_history GUARDED_BY(g_hs20Lock);
    NetworkProfileMgr m_profileMgr GUARDED_BY(g_hs20Lock);
    Hs20NetworkList m_networkList GUARDED_BY(g_hs20Lock);
    NetworkRetryHelper m_retryHelper GUARDED_BY(g_hs20Lock);
    BlockedNetworkList m_blockedNetworks GUARDED_BY(g_hs20Lock);

    // Written under the lock, read also without it.

    std::atomic<bool> m_bConnectionStarted{false};  // a connection that this program asked for is under way
    std::atomic<bool> m_bQueryingAnqp{false};
    std::atomic<bool> m_bUserDisconnecting{false};  // the client asked to disconnect
    std::atomic<bool> m_bRoaming{false};            // between roaming start and end
    std::atomic<bool> m_bHs20Connected{false};      // the last connection that this program asked for lives

    bool isRadioOnCached() const { return m_bRadioOn; }
    bool isThreadLate() const { return m_interworkingMgr.isThreadLate(); }

    /// When the client last switched the hotspot function; at first 100 s before the object was made.
    TimeValue m_lastHs20ToggleTime GUARDED_BY(g_hs20Lock);

private:
    bool isOwnConnection(const WLAN_CONNECTION_NOTIFICATION_DATA& data) const REQUIRES(g_hs20Lock);
    int onOwnResult(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t& eapMethod)
        REQUIRES(g_hs20Lock);
    int onForeignResult(const WLAN_CONNECTION_NOTIFICATION_DATA& data) REQUIRES(g_hs20Lock);
    int carryOutPendingRequest() REQUIRES(g_hs20Lock);
    int onSuccess(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& profile,
                  std::uint32_t& eapMethod) REQUIRES(g_hs20Lock);
    int onFailure(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& profile)
        REQUIRES(g_hs20Lock);
    int tryMachineMode(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& failed)
        REQUIRES(g_hs20Lock);
    int tryNextCredential(const WLAN_CONNECTION_NOTIFICATION_DATA& data) REQUIRES(g_hs20Lock);
    int endAttempt(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t outcome) REQUIRES(g_hs20Lock);
    int report(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t outcome) REQUIRES(g_hs20Lock);
    void clearNumRetriesOnConnSuccess(const std::wstring& profileName, std::string_view ssid)
        REQUIRES(g_hs20Lock);

    int connectBssNow(const std::string& ssid) REQUIRES(g_hs20Lock);
    int connectPlainly(const std::string& ssid) REQUIRES(g_hs20Lock);
    int tryConnectHs20BssUsingNextCredential(std::string_view ssid, int& connResult) REQUIRES(g_hs20Lock);
    const Credential* nextUntried(const Hs20Network& network) REQUIRES(g_hs20Lock);
    int connectFreshly(const Hs20Network& network, const Credential& credential) REQUIRES(g_hs20Lock);
    DWORD requestConnection(std::string_view ssid, const NetworkProfile* profile) REQUIRES(g_hs20Lock);
    const char* reasonNotToBlock() const REQUIRES(g_hs20Lock);

    int sendIhvCmd();
    void tellClient(const std::function<void(const ClientEvents&)>& tell) REQUIRES(g_hs20Lock);
    const char* initSteps();
    void recordConnectionAtStart();
    void logInterfaceGuid() const;

    std::atomic<bool> m_bInitialized{false};
    std::atomic<bool> m_bRadioOn{false};
    std::array<std::uint8_t, 6> m_macAddress{};
    std::atomic<std::uint32_t> m_ifIndex{0};
    WlanInterface m_wlan;
    SupplicantState m_state GUARDED_BY(g_hs20Lock) = SupplicantState::InvalidState;

    // What tells this program's connections from the operating system's, and the client's from
    // auto-connect's.
    std::string m_connectingSsid GUARDED_BY(g_hs20Lock);
    bool m_bConnectionStartedByOs GUARDED_BY(g_hs20Lock) = false;
    bool m_bManualConnectStarted GUARDED_BY(g_hs20Lock) = false;
    bool m_bManualConnectPending GUARDED_BY(g_hs20Lock) = false;
    std::string m_pendingManualSsid GUARDED_BY(g_hs20Lock);
    std::vector<std::int32_t> m_triedCredentialIds GUARDED_BY(g_hs20Lock);

    InterworkingMgr m_interworkingMgr{this};  // its thread uses all of the above
};

}  // namespace vexa
