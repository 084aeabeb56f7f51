#include <CLI/CLI.hpp>
#include <boost/asio/io_context.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/PortOption.h"
#include "client/demo/DemoCredentials.h"
#include "client/demo/DemoMachine.h"
#include "client/machine/Browser.h"
#include "client/machine/ServiceHost.h"
#include "client/machine/ServiceParent.h"
#include "client/panel/Panel.h"
#include "client/panel/PanelServer.h"
#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

using std::chrono::milliseconds;

// How often it is looked whether the user has had enough.
constexpr milliseconds kBetweenLooks{50};
constexpr milliseconds kGoodbye{200};
constexpr milliseconds kStopPatience{500};
constexpr std::chrono::seconds kAnswerLimit{10};

struct PanelOptions {
    PortOption spectral{Half::Spectral};
    PortOption hotspot{Half::Hotspot};
    std::uint16_t port = 0;
    std::string recordings;
    int linger = 30;
    bool noOpen = false;
    bool demo = false;
    bool json = false;
};

void show(const PanelOptions& options, const std::string& url) {
    if (options.json) {
        Json::Value object(Json::objectValue);
        object["url"] = url;
        std::cout << jsonLine(object) << std::endl;
    } else {
        std::cout << url << std::endl;
    }
    if (options.noOpen) return;
    const bool isOpened = openInBrowser(url);
    if (!options.json)
        std::cout << (isOpened ? "It opens in the browser" : "Open this address in a browser")
                  << "; Ctrl-C ends it." << std::endl;
}

int serve(const PanelOptions& options, Signals& signals) {
    boost::asio::io_context context{1};
    const PanelRecordings recordings(options.recordings);
    Panel panel(context, options.spectral, options.hotspot, recordings);
    PanelServer server(context, options.port, recordings, panel);
    show(options, server.url());
    panel.begin();
    EventLoop loop(signals);
    while (!panel.isLeftFor(std::chrono::seconds(options.linger)) && loop.wait(Deadline::in({})))
        context.run_for(kBetweenLooks);
    server.close();
    panel.end();
    context.run_for(kGoodbye);
    return kExitOk;
}

/// The machine of the demo, with its service and credentials, for as long as the panel.
int serveDemo(PanelOptions& options, Signals& signals) {
    const TemporaryMachine machine;
    const MachineFolder folder(machine.path().string());
    prepareDemoMachine(folder);
    StopSource stop(signals, false);
    StartRequest request;
    request.machine = machine.path().string();
    request.builtInScenario = true;
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
            serve(options, signals);
        } catch (const StoppedByUser&) {  // before there was anything to see
        }
    }
    parent.stopSoon(kStopPatience);
    return kExitOk;
}

int runPanel(PanelOptions& options) {
    Signals signals;
    return options.demo ? serveDemo(options, signals) : serve(options, signals);
}

}  // namespace

void addPanelCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<PanelOptions>();
    CLI::App* command = app.add_subcommand(
        "panel",
        "Show spectrum, networks and credentials in the browser, until its page is closed or Ctrl-C");
    PortOption::addBothTo(*command, options->spectral, options->hotspot);
    command->add_option("--port", options->port, "Serve the page on this port; default: a free one")
        ->type_name("N")
        ->check(CLI::Range(1, 65535));
    command->add_flag("--no-open", options->noOpen,
                      "Open no browser; the address that is printed lets in once");
    command
        ->add_option("--recordings", options->recordings, "Folder for recordings; default: the present one")
        ->type_name("DIR");
    command
        ->add_option("--linger", options->linger,
                     "Go on for so long after the last page was closed; default 30")
        ->type_name("SECONDS")
        ->check(CLI::Range(0, 86400));
    if (hasSimulatedMachines()) command->add_flag("--demo", options->demo, "Show the machine of `vexa demo`");
    command->add_flag("--json", options->json, "Print JSON: the address");
    command->callback([options, &exitCode] { exitCode = runPanel(*options); });
}

}  // namespace vexa::client
