#include "service/IpcServers.h"

#include <memory>

#include "base/StandardOutput.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "platform/Event.h"
#include "service/NotificationRouter.h"
#include "spectral/SAPortlink.h"
#include "text/NeverDestroyed.h"

namespace vexa {

namespace {

std::unique_ptr<SAPortlink> g_pSpectralServer;

/// Set once it is known by which handle a server answers: a client can be faster.
template <class Server>
platform::Event& canAnswer() {
    static NeverDestroyed<platform::Event> event(platform::Reset::Manual, "the handle of a server");
    return event.get();
}

template <class Server>
void onIpcMessage(const char* bytes, std::uint32_t length, void* context) {
    canAnswer<Server>().wait();
    Server::OnIpcMessage(bytes, length, context);
}

template <class Server>
bool openChannel(Server& server, std::int32_t port) {
    platform::Event& isHandleKnown = canAnswer<Server>();
    server.m_hIpc = IpcCreateServer(1, 0, onIpcMessage<Server>, &server, port);
    isHandleKnown.set();
    return server.m_hIpc != 0;
}

}  // namespace

void createIpcServers(std::int32_t saPort, std::uint32_t hs20Port) {
    g_pSpectralServer = std::make_unique<SAPortlink>(onWlanNotification);

    SAHotSpotPortlink& hotspot = SAHotSpotPortlink::instance();
    hotspot.updateCardState();
    if (hotspot.m_hIpc == 0) {
        if (openChannel(hotspot, static_cast<std::int32_t>(hs20Port)))
            printToStandardOutput("create ipc successfully,port=%d\n", static_cast<int>(hs20Port));
        else
            printToStandardOutput("create ipc server fail\n");
    }

    if (openChannel(*g_pSpectralServer, saPort))
        printToStandardOutput("Create IPC server successfully, port=%d\n", saPort);
    else
        printToStandardOutput("Create IPC server failed.\n");
}

void destroySpectralServer() {
    g_pSpectralServer.reset();
}

}  // namespace vexa
