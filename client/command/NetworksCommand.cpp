#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/hotspot/Network.h"
#include "client/port/HotspotPort.h"
#include "client/terminal/TerminalKeys.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

struct NetworksOptions {
    HotspotOptions hotspot;
    bool watch = false;
};

bool show(const NetworkList& list, const OutputOptions& options) {
    return print(options, networksJson(list),
                 list.empty() ? std::vector<std::string>{"No hotspot networks."} : networkTable(list));
}

/// An empty list has reasons that the list does not tell.
void explain(HotspotPort& port, const HotspotOptions& options) {
    const auto isOn = hotspotSwitch(options.port.machine());
    if (!askRadio(port)) {
        std::cerr << "vexa: the radio is off\n";
    } else if (isOn && !*isOn) {
        std::cerr << "vexa: hotspot networks are disabled: `vexa enable` enables them\n";
    }
}

// An adapter that comes is asked for its list; all later lists come by themselves.
void watch(HotspotPort& port, NetworkList shown, const OutputOptions& options) {
    while (const auto event = port.next(Deadline::never())) {
        if (event->id == contract::kCardPlugIn) port.tell(contract::kGetAllNetworkList);
        if (event->id != contract::kGetAllNetworkList) continue;
        NetworkList list = networkList(payloadOf(*event));
        if (list == shown) continue;
        shown = std::move(list);
        if (!options.json) std::cout << '\n';
        if (!show(shown, options)) return;
    }
}

int runNetworks(const NetworksOptions& options) {
    Signals signals;
    HotspotPort port(options.hotspot.port.find(), signals, options.hotspot.limit());
    const auto list = askNetworks(port);
    if (!list && !options.watch) throw ClientError(kNoAdapter);
    if (!list) std::cerr << "vexa: " << kNoAdapter << '\n';
    if (list) show(*list, options.hotspot);
    if (list && list->empty() && !options.hotspot.json) explain(port, options.hotspot);
    if (!options.watch) return kExitOk;
    std::optional<TerminalKeys> keys;
    if (TerminalKeys::isUsable()) port.endWith(keys.emplace());
    try {
        watch(port, list.value_or(NetworkList()), options.hotspot);
    } catch (const StoppedByUser&) {  // that is how it ends
    }
    return kExitOk;
}

}  // namespace

void addNetworksCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<NetworksOptions>();
    CLI::App* command =
        app.add_subcommand("networks", "List the hotspot networks in range, with their realms");
    options->hotspot.addTo(
        *command,
        {{{"name", "Network"}, {"connected", "Connected"}, {"internet", "Internet"}, {"realms", "Realms"}}});
    command->add_flag("--watch", options->watch, "Go on with every list that differs, until q or Ctrl-C");
    command->callback([options, &exitCode] { exitCode = runNetworks(*options); });
}

}  // namespace vexa::client
