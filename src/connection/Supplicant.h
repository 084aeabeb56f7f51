#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "base/IpInterface.h"
#include "base/NetworkListLock.h"
#include "base/TimeValue.h"
#include "config/Credential.h"
#include "config/ResultCodes.h"
#include "connection/ClientEvents.h"
#include "connection/ConnectionHistory.h"
#include "connection/EngineState.h"
#include "connection/InterworkingMgr.h"
#include "connection/SupplicantState.h"
#include "connection/WlanInterface.h"

namespace vexa {

class SupplicantMgr;

/// All that belongs to one adapter. Made and ended by SupplicantMgr; notification and command threads come
/// here with a reference that keeps the object alive, also beyond deinit(): its events and its handle stay
/// members to the end.
class Supplicant {
public:
    /// `mgr` outlives all supplicants.
    Supplicant(const GUID& interfaceGuid, SupplicantMgr& mgr);
    ~Supplicant();
    Supplicant(const Supplicant&) = delete;
    Supplicant& operator=(const Supplicant&) = delete;

    /// The outcome is in isInitialized(). A failure releases what was made before it.
    void init() EXCLUDES(g_hs20Lock);
    /// REQUIRES: the network list lock not held.
    void deinit() EXCLUDES(g_hs20Lock);
    /// Back to a clean start when the adapter comes back, without losing the object.
    void reset() EXCLUDES(g_hs20Lock);
    bool isInitialized() const { return m_bInitialized; }
    bool isThreadLate() const { return m_interworkingMgr.isThreadLate(); }
    const GUID& interfaceGuid() const { return m_wlan.guid(); }

    /// The live state. InvalidState if it can't be told.
    SupplicantState queryState() const { return m_wlan.queryState(); }
    /// The cached radio state, and the live one; true also if that can't be told.
    bool isRadioOnCached() const { return m_bRadioOn; }
    bool isRadioOn() const { return m_wlan.isRadioOn(); }
    bool hasInternetAccess() const { return m_ip.hasInternetAccess(); }
    /// The network of the WLAN service's current connection; null if there is none in the list. Good while
    /// the lock is held.
    Hs20Network* getConnectedBss(bool includeConnecting) const REQUIRES(g_hs20Lock);

    const Hs20NetworkList& networks() const REQUIRES(g_hs20Lock) { return m_engine.m_networkList; }
    const CredentialTable& credentials() const REQUIRES(g_hs20Lock) {
        return m_engine.m_config.credentials();
    }

    // Steps of the connecting thread.

    bool hasUnfetchedAnqpInfo() const;
    /// Starts the ANQP queries of all networks. kSuccess or kFailure.
    ResultCode queryHs20NetworkAnqpInfo();
    /// Asks for a connection; also kSuccess where none is needed.
    ResultCode connectToNetwork(const Hs20Network& network, const NetworkProfile& profile)
        REQUIRES(g_hs20Lock);

    // Messages of the hotspot module.

    ResultCode onNetworkListChanged(Bytes payload);
    ResultCode onAnqpInfoChanged(Bytes payload);
    void onAnqpQueryCompleted();
    ResultCode onUserDisconnected(Bytes payload);
    ResultCode onSessionChanged(Bytes payload);

    // Notifications of the WLAN service. Null data changes nothing but what every call does.

    ResultCode onConnectionStart(const WLAN_CONNECTION_NOTIFICATION_DATA* data);
    ResultCode onConnectionComplete(const WLAN_CONNECTION_NOTIFICATION_DATA* data);
    ResultCode onDisconnected(const WLAN_CONNECTION_NOTIFICATION_DATA* data);
    ResultCode onRadioStateChanged(const WLAN_PHY_RADIO_STATE* data);
    void onRoamingStart();
    void onRoamingEnd();

    // Wishes of the user.

    /// At once, or when the running attempt has ended. kSuccess if the connection was started or postponed;
    /// kFailure; kInvalidArgument without an SSID.
    ResultCode connectBss(std::string_view ssid);
    /// Leaves the network if it is the one that is connected or connecting; auto-connect then stays away from
    /// it.
    void disconnectBss(std::string_view ssid);
    /// Reads the realms of all networks anew, after a disconnection if need be.
    void updateNetworkRealm();

    /// The user's switch for the whole hotspot function. Off, the connection to a hotspot ends.
    bool isHs20Enabled() const;
    void setHs20Enabled(bool enable) REQUIRES(g_hs20Lock);

    /// Change the stored credentials, save, and wake the connecting thread where it may find more to do. A
    /// refused change changes nothing.
    void addCredential(const CredentialInput& input);
    ResultCode deleteCredential(std::int32_t id);
    ResultCode updateCredential(CredentialInput input);
    /// `position` counts from 1.
    void setCredentialPosition(std::int32_t id, std::int32_t position);

private:
    /// What may be left, and whether auto-connect then stays away from it.
    enum class Leave { Any, Hs20, Hs20AndBlock };

    const char* initSteps();
    void recordConnectionAtStart();

    /// The cached state. Claims about the WLAN service are only taken over once it agrees.
    void setState(SupplicantState state);
    void setRadioState(bool on);
    void tellClient(const std::function<void(const ClientEvents&)>& tell) REQUIRES(g_hs20Lock);
    void sendNetworkList() REQUIRES(g_hs20Lock);
    /// An outcome without a connection's data.
    void sendConnectionResult(std::uint32_t outcome) REQUIRES(g_hs20Lock);

    /// Takes over a report of the networks in range, fetches what ANQP has found out about each, and tells
    /// the client. kInvalidArgument without records.
    ResultCode updateHs20NetworkList(const std::vector<Hs20BssRecord>& records);

    /// Requests to the hotspot module. kSuccess or kFailure.
    ResultCode sendIhvCmd();
    ResultCode getHs20BssListFromIHV();
    ResultCode fetchBssAnqpInfo(Hs20Network& network) REQUIRES(g_hs20Lock);

    bool isOwnConnection(const WLAN_CONNECTION_NOTIFICATION_DATA& data) const REQUIRES(g_hs20Lock);
    ResultCode onOwnResult(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t& eapMethod)
        REQUIRES(g_hs20Lock);
    ResultCode onForeignResult(const WLAN_CONNECTION_NOTIFICATION_DATA& data) REQUIRES(g_hs20Lock);
    /// Whether a connection is under way now.
    bool carryOutPendingRequest(const std::wstring& finished) REQUIRES(g_hs20Lock);
    ResultCode onSuccess(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& profile,
                         std::uint32_t& eapMethod) REQUIRES(g_hs20Lock);
    ResultCode onFailure(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& profile)
        REQUIRES(g_hs20Lock);
    ResultCode tryMachineMode(const WLAN_CONNECTION_NOTIFICATION_DATA& data, const NetworkProfile& failed)
        REQUIRES(g_hs20Lock);
    ResultCode tryNextCredential(const WLAN_CONNECTION_NOTIFICATION_DATA& data) REQUIRES(g_hs20Lock);
    ResultCode endAttempt(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t outcome)
        REQUIRES(g_hs20Lock);
    ResultCode report(const WLAN_CONNECTION_NOTIFICATION_DATA& data, std::uint32_t outcome)
        REQUIRES(g_hs20Lock);

    ResultCode connectBssNow(const std::string& ssid) REQUIRES(g_hs20Lock);
    ResultCode connectPlainly(const std::string& ssid) REQUIRES(g_hs20Lock);
    ConnectOutcome tryConnectHs20BssUsingNextCredential(std::string_view ssid) REQUIRES(g_hs20Lock);
    const Credential* nextUntried(const Hs20Network& network) REQUIRES(g_hs20Lock);
    /// With a new profile, which goes again if no request was made.
    ResultCode connectFreshly(const Hs20Network& network, const Credential& credential) REQUIRES(g_hs20Lock);
    DWORD requestConnection(std::string_view ssid, const NetworkProfile* profile) REQUIRES(g_hs20Lock);

    /// kFailure: what is connected may not be left, or the request failed.
    ResultCode disconnectedBSS(Leave what) REQUIRES(g_hs20Lock);
    const char* reasonNotToBlock() const REQUIRES(g_hs20Lock);
    /// Null if there is none.
    const Credential* findCredential(std::int32_t id) REQUIRES(g_hs20Lock);

    SupplicantMgr& m_mgr;
    EngineState m_engine;
    ConnectionHistory m_history GUARDED_BY(g_hs20Lock);
    WlanInterface m_wlan;
    IpInterface m_ip;

    std::atomic<bool> m_bInitialized{false};
    std::atomic<bool> m_bRadioOn{false};
    SupplicantState m_state GUARDED_BY(g_hs20Lock) = SupplicantState::InvalidState;

    std::atomic<bool> m_bRoaming{false};            // between roaming start and end
    std::atomic<bool> m_bUserDisconnecting{false};  // the client asked to disconnect
    // The last connection that this program asked for lives.
    bool m_bHs20Connected GUARDED_BY(g_hs20Lock) = false;
    /// When the client last switched the hotspot function; at first 100 s before the object was made.
    TimeValue m_lastHs20ToggleTime GUARDED_BY(g_hs20Lock);

    // What tells this program's connections from the operating system's, and the client's from
    // auto-connect's.
    std::string m_connectingSsid GUARDED_BY(g_hs20Lock);
    bool m_bConnectionStartedByOs GUARDED_BY(g_hs20Lock) = false;
    bool m_bManualConnectStarted GUARDED_BY(g_hs20Lock) = false;
    bool m_bManualConnectPending GUARDED_BY(g_hs20Lock) = false;
    std::string m_pendingManualSsid GUARDED_BY(g_hs20Lock);
    std::vector<std::int32_t> m_triedCredentialIds GUARDED_BY(g_hs20Lock);

    InterworkingMgr m_interworkingMgr{*this, m_engine};  // its thread uses all of the above
};

}  // namespace vexa
