#include "hotspotport/SAHotSpotPortlink.h"

#include <cstdlib>

#include "base/DiagnosticLog.h"
#include "channel/Envelope.h"
#include "channel/JsonText.h"
#include "connection/SupplicantMgr.h"
#include "contract/Ports.h"
#include "text/NeverDestroyed.h"

namespace vexa {

namespace {

// An event for which there is no memory is lost; the engine goes on.
template <class Send>
void tell(Send send) {
    if (!withinMemoryOfJson(send)) Log(6, "ERROR: Out of memory, an event was not sent to UI.");
}

}  // namespace

SAHotSpotPortlink& SAHotSpotPortlink::instance() {
    static NeverDestroyed<SAHotSpotPortlink> server;
    [[maybe_unused]] static const int registered = std::atexit([] { instance().close(); });
    return server.get();
}

SAHotSpotPortlink::SAHotSpotPortlink() {
    m_hClientHandle.open();

    const platform::LockGuard lock(g_hs20Lock);
    SupplicantMgr::instance().setClientEvents({
        [this](Supplicant& supplicant) { tell([&] { SendNetworkList(&supplicant); }); },
        [this] { tell([this] { SendDetectedHotspot(); }); },
        [this](const ConnectionResult& result) { tell([&] { SendConnectionResult(result); }); },
        [this] { tell([this] { SendInternetAccess(); }); },
    });
}

void SAHotSpotPortlink::close() {
    m_hClientHandle.close();
    if (const IpcHandle ipc = m_hIpc.exchange(0)) IpcClose(ipc);
}

void SAHotSpotPortlink::updateCardState() {
    m_bCardIn = m_interfaceGuid.refresh(m_hClientHandle.get());
}

bool SAHotSpotPortlink::SendData(const std::string& data, const std::string& eventId) {
    return SendEvent(buildEnvelope(eventId, contract::kHotspotSource, data));
}

bool SAHotSpotPortlink::SendEvent(const std::string& text) {
    const IpcHandle ipc = m_hIpc;
    if (ipc == 0) {
        Log(6, "ERROR: IPC handle is NULL in SAHotSpotPortlink::SendData.");
        return false;
    }
    return IpcSend(ipc, text.data(), static_cast<std::uint32_t>(text.size())) == 1;
}

std::shared_ptr<Supplicant> hotspotSupplicant(const SAHotSpotPortlink& server) {
    return SupplicantMgr::instance().findSupplicantByGuid(server.m_interfaceGuid.get());
}

}  // namespace vexa
