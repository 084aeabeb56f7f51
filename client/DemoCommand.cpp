#include <CLI/CLI.hpp>
#include <memory>

#include "client/ClientError.h"
#include "client/Commands.h"
#include "client/MachineFolder.h"
#include "client/ServiceParent.h"
#include "client/SpectrumWatch.h"

namespace vexa::client {

namespace {

constexpr int kDefaultSeconds = 20;

struct DemoOptions {
    int seconds = kDefaultSeconds;
    std::string service;
    bool json = false;
};

int runDemo(const DemoOptions& options) {
    Signals signals;
    const TemporaryMachine machine;
    StopSource stop(signals, false);
    StartRequest request;
    request.machine = machine.path().string();
    request.builtInScenario = true;
    request.service = options.service;
    ServiceParent parent(request, stop);
    const auto state = parent.waitUntilReady();
    if (state == ServiceParent::State::Ended) return kExitFailed;
    if (state == ServiceParent::State::Ready) {
        SpectralScan scan(parent.ports().sa);
        watchSpectrum(scan, signals,
                      options.json ? SpectrumOutput::Form::Json : SpectrumOutput::Form::Readable,
                      std::chrono::seconds(options.seconds));
    }
    return parent.stop();
}

}  // namespace

void addDemoCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<DemoOptions>();
    CLI::App* command =
        app.add_subcommand("demo", "Start a service of its own and show the spectrum for a while");
    command->add_option("--seconds", options->seconds, "How long; default 20")
        ->type_name("N")
        ->check(CLI::Range(1, 86400));
    command
        ->add_option("--service", options->service,
                     "The service's executable; default: the one beside this program")
        ->type_name("PATH");
    command->add_flag("--json", options->json, "An event a line, as JSON, and a JSON object at the end");
    command->callback([options, &exitCode] { exitCode = runDemo(*options); });
}

}  // namespace vexa::client
