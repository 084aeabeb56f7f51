#include "client/demo/DemoCredentials.h"
#include "client/demo/DemoMachine.h"
#include "client/machine/ServiceParent.h"
#include "client/panel/PanelServing.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr std::chrono::seconds kAnswerLimit{10};

int serveDemo(PanelOptions& options, Signals& signals) {
    const TemporaryMachine machine;
    const StartRequest request = prepareDemoMachine(machine);
    StopSource stop(signals, false);
    ServiceParent parent(request, stop);
    const auto state = parent.waitUntilReady();
    if (state == ServiceParent::State::Ended) return kExitFailed;
    if (state == ServiceParent::State::Ready) {
        try {
            HotspotPort hotspot(parent.ports().hs20, signals, kAnswerLimit);
            storeDemoCredentials(hotspot);
            hotspot.close();
            options.spectral.setMachine(request.machine);
            options.hotspot.setMachine(request.machine);
            servePanel(options, signals);
        } catch (const StoppedByUser&) {  // before there was anything to see
        }
    }
    parent.stopSoon(kDemoStopPatience);
    return kExitOk;
}

}  // namespace

ServePanel demoPanel() {
    return &serveDemo;
}

}  // namespace vexa::client
