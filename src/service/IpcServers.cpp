#include "service/IpcServers.h"

#include <memory>

#include "base/StandardOutput.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "service/NotificationRouter.h"
#include "spectral/SAPortlink.h"

namespace vexa {

namespace {

std::unique_ptr<SAPortlink> g_pSpectralServer;

}  // namespace

void createIpcServers(std::int32_t saPort, std::uint32_t hs20Port) {
    g_pSpectralServer = std::make_unique<SAPortlink>(onWlanNotification);

    SAHotSpotPortlink& hotspot = SAHotSpotPortlink::instance();
    hotspot.updateCardState();
    if (hotspot.m_hIpc == 0) {
        hotspot.m_hIpc = IpcCreateServer(1, 0, SAHotSpotPortlink::OnIpcMessage, &hotspot,
                                         static_cast<std::int32_t>(hs20Port));
        if (hotspot.m_hIpc != 0)
            printToStandardOutput("create ipc successfully,port=%d\n", static_cast<int>(hs20Port));
        else
            printToStandardOutput("create ipc server fail\n");
    }

    SAPortlink& spectral = *g_pSpectralServer;
    spectral.m_hIpc = IpcCreateServer(1, 0, SAPortlink::OnIpcMessage, &spectral, saPort);
    if (spectral.m_hIpc != 0)
        printToStandardOutput("Create IPC server successfully, port=%d\n", saPort);
    else
        printToStandardOutput("Create IPC server failed.\n");
}

void destroySpectralServer() {
    g_pSpectralServer.reset();
}

}  // namespace vexa
