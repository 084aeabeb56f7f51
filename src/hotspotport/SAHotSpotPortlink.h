#pragma once

#include <json/value.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "base/AdapterIdentity.h"
#include "base/NetworkListLock.h"
#include "base/WlanHandle.h"
#include "channel/Ipc.h"
#include "connection/ClientEvents.h"
#include "platform/WlanApi.h"
#include "text/LittleEndian.h"

namespace vexa {

/// The hotspot port's server: takes the client's commands and sends him the hotspot events. Any thread may
/// call anything. Every command finds its Supplicant anew, by the adapter's GUID.
class SAHotSpotPortlink {
public:
    /// The one of the process, built on first use; closed at its end, and not destroyed.
    static SAHotSpotPortlink& instance();

    SAHotSpotPortlink();
    SAHotSpotPortlink(const SAHotSpotPortlink&) = delete;
    SAHotSpotPortlink& operator=(const SAHotSpotPortlink&) = delete;

    /// Closes the WLAN handle, then the channel to the clients. Once closed, nothing is sent any more.
    void close();

    /// Asks anew whether the adapter is present; keeps the last GUID if it is not.
    void updateCardState();

    /// The receive callback of the port; `context` is the server.
    static void OnIpcMessage(const char* bytes, std::uint32_t length, void* context);
    void HandleCommand(const Json::Value& root);

    /// Sends one event to all clients; true if one took it. A message that could not be sent is lost.
    bool SendData(const std::string& data, const std::string& eventId);
    /// The same of one that is whole already.
    bool SendEvent(const std::string& text);
    void SendRadioState();
    /// Tells the card state as it was last asked for.
    void SendCardState();
    /// In order of priority. Nothing is sent without a Supplicant.
    void SendCredentialList();

    /// The networks in range, or null while the radio or the function is off. `supplicant` may be null and is
    /// then looked up; nothing is sent unless one is found. Holds the network list lock.
    void SendNetworkList(Supplicant* supplicant);
    void SendInternetAccess();
    void SendConnectionResult(const ConnectionResult& result);
    void SendDetectedHotspot();
    /// The driver's state, from a message of the hotspot module.
    void SendSupplicantState(Bytes payload);

    /// The client's switch for the whole hotspot function. Holds the network list lock.
    void setHotSpotAutoConnect(bool enable);
    /// The user's wish to join a network or to leave it. The outcome comes as an event. No name at all is one
    /// that no network can have; an empty one is no wish.
    void connectNetworkByName(const std::optional<std::string>& name);
    void disconnectNetworkByName(const std::string& name);
    /// Reads the realms of all networks anew, after a disconnection if need be.
    void updateNetworkRealm();

    std::atomic<bool> m_bCardIn{false};
    std::atomic<IpcHandle> m_hIpc{0};
    /// The adapter as the last successful check found it: the key of its Supplicant.
    SharedGuid m_interfaceGuid;

private:
    WlanHandle m_hClientHandle;
};

/// The Supplicant of the server's adapter, kept alive by the result; null if there is none.
std::shared_ptr<Supplicant> hotspotSupplicant(const SAHotSpotPortlink& server);

}  // namespace vexa
