#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/machine/MachineRegistry.h"
#include "client/port/HotspotPort.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

void say(const HotspotOptions& options, const char* member, const Json::Value& value, const char* sentence) {
    Json::Value object(Json::objectValue);
    object[member] = value;
    print(options, object, sentence);
}

// Without an adapter, or before it knows the adapter, the service answers all the same, and turns nothing. It
// has a list when it knows it.
void requireAdapter(HotspotPort& port) {
    if (!askNetworks(port)) throw ClientError(std::string(kNoAdapter) + ", and without one nothing was done");
}

int runSwitch(const HotspotOptions& options, bool isOn) {
    Signals signals;
    HotspotPort port(options.port.find(), signals, options.limit());
    requireAdapter(port);
    const auto isOurs = [isOn](const Json::Value& payload) {
        return payload.isBool() && payload.asBool() == isOn;
    };
    const auto answer = port.ask(contract::kSetHotspotAutoConnect, isOn ? "true" : "false",
                                 contract::kSetHotspotAutoConnect, isOurs);
    if (!answer.isAccepted) throw ClientError("the service did not turn the switch");
    const auto machine = options.port.machine();
    if (machine && !writeHotspotSwitch(*machine, isOn))
        throw ClientError("the switch was turned, but it cannot be written down in " +
                          machine->registryFile().string() + " for the next start");
    say(options, "hotspot", isOn, isOn ? "Hotspot networks are enabled." : "Hotspot networks are disabled.");
    return kExitOk;
}

int runRefresh(const HotspotOptions& options) {
    Signals signals;
    HotspotPort port(options.port.find(), signals, options.limit());
    requireAdapter(port);
    port.tell(contract::kUpdateNetworkRealm);
    port.waitUntilHandled();
    say(options, "refreshing", true, "The realms of the networks are being asked for again.");
    return kExitOk;
}

void addSwitch(CLI::App& app, int& exitCode, const char* name, const char* description, bool isOn) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command = app.add_subcommand(name, description);
    options->addTo(*command, {{{"hotspot", "Hotspot"}}});
    command->callback([options, isOn, &exitCode] { exitCode = runSwitch(*options, isOn); });
}

}  // namespace

void addEnableCommand(CLI::App& app, int& exitCode) {
    addSwitch(app, exitCode, "enable", "Use hotspot networks, and connect to them without being asked", true);
}

void addDisableCommand(CLI::App& app, int& exitCode) {
    addSwitch(app, exitCode, "disable", "Use no hotspot networks; ends a connection to one", false);
}

void addRefreshCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command =
        app.add_subcommand("refresh", "Ask the networks for their realms again; ends a connection first");
    options->addTo(*command, {{{"refreshing", "Refreshing"}}});
    command->callback([options, &exitCode] { exitCode = runRefresh(*options); });
}

}  // namespace vexa::client
