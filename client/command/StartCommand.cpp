#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/Output.h"
#include "client/machine/ServiceHost.h"
#include "client/machine/ServiceParent.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr int kHighestPort = 65535;

struct StartOptions {
    StartRequest request;
    std::uint16_t controlPort = 0;
    bool stopOnEof = false;
    OutputOptions output;
};

int runStart(const StartOptions& options) {
    Signals signals;
    StopSource stop(signals, options.stopOnEof);
    ServiceParent parent(options.request, stop);
    if (parent.waitUntilReady() == ServiceParent::State::Ready) {
        print(options.output, portsJson(parent.ports()), "ready " + portsAsText(parent.ports()));
        parent.waitForEnd();
    }
    return parent.stop();
}

/// Gives the one that opens the control channel.
CLI::Option* addMachineOptions(CLI::App& command, StartOptions& options) {
    StartRequest& request = options.request;
    command.add_option("--machine", request.machine, "Folder of the machine")->type_name("DIR");
    command.add_option("--scenario", request.scenario, "What the machine goes through, a JSON file")
        ->type_name("FILE");
    return command
        .add_option("--control-port", options.controlPort,
                    "Open the machine's control channel; 0 picks a free port")
        ->type_name("N")
        ->check(CLI::Range(0, kHighestPort));
}

}  // namespace

void addStartCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<StartOptions>();
    CLI::App* command = app.add_subcommand(
        "start", hasSimulatedMachines() ? "Start the service on a simulated machine, and stop it at the end"
                                        : "Start the service, and stop it at the end");
    StartRequest& request = options->request;
    command->add_option("--sa-port", request.saPort, "Port of the spectral analyser; 0 picks a free one")
        ->type_name("N")
        ->check(CLI::Range(0, kHighestPort));
    command->add_option("--hs20-port", request.hs20Port, "Port of the hotspot half; 0 picks a free one")
        ->type_name("N")
        ->check(CLI::Range(0, kHighestPort));
    command
        ->add_option("--service", request.service,
                     "The service's executable; default: the one that came with this program")
        ->type_name("PATH");
    command->add_flag("--stop-on-eof", options->stopOnEof, "Stop as well when standard input ends");
    options->output.addTo(
        *command, {{{"sa", "Spectral analyser"}, {"hs20", "Hotspot"}, {"control", "Control channel"}}},
        "Announce the ports as a JSON object");
    CLI::Option* const control = hasSimulatedMachines() ? addMachineOptions(*command, *options) : nullptr;
    command->callback([options, control, &exitCode] {
        if (control != nullptr && control->count() > 0) options->request.controlPort = options->controlPort;
        exitCode = runStart(*options);
    });
}

}  // namespace vexa::client
