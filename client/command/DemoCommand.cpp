#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/demo/DemoCredentials.h"
#include "client/demo/DemoMachine.h"
#include "client/demo/DemoStory.h"
#include "client/machine/MachineFolder.h"
#include "client/machine/ServiceParent.h"
#include "client/port/JsonLine.h"
#include "client/spectrum/SpectralText.h"
#include "client/spectrum/SpectrumWatch.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr int kDefaultSeconds = 20;
constexpr std::chrono::seconds kDemoLimit{10};

struct DemoOptions {
    int seconds = kDefaultSeconds;
    std::string service;
    bool json = false;
    bool showPasswords = false;
};

SpectrumOutput::Form formOf(const DemoOptions& options) {
    return options.json ? SpectrumOutput::Form::Json : SpectrumOutput::Form::Readable;
}

CredentialList storedCredentials(const ServicePorts& ports, Signals& signals) {
    HotspotPort hotspot(ports.hs20, signals, kDemoLimit);
    return storeDemoCredentials(hotspot);
}

/// False if the user has ended it before there was anything to see.
bool showAll(const DemoOptions& options, const ServicePorts& ports, const MachineFolder& machine,
             Signals& signals) try {
    const Deadline end = Deadline::in(std::chrono::seconds(options.seconds));
    DemoStory story(ports.hs20, machine, storedCredentials(ports, signals),
                    options.showPasswords ? Passwords::Shown : Passwords::Hidden);
    SpectrumOutput output(formOf(options), &story);
    SpectralScan scan(ports.sa);
    watchSpectrum(scan, signals, output, end, &story);
    return true;
} catch (const StoppedByUser&) {
    return false;
}

int runDemo(const DemoOptions& options) {
    Signals signals;
    const TemporaryMachine machine;
    StartRequest request = prepareDemoMachine(machine);
    const MachineFolder folder(request.machine);
    StopSource stop(signals, false);
    request.service = options.service;
    ServiceParent parent(request, stop);
    const auto state = parent.waitUntilReady();
    if (state == ServiceParent::State::Ended) return kExitFailed;
    if (state == ServiceParent::State::Ready && showAll(options, parent.ports(), folder, signals))
        return parent.stopSoon(kDemoStopPatience);
    parent.stopSoon(kDemoStopPatience);
    std::cout << (options.json ? jsonLine(summaryJson(SpectralView())) : summaryText(SpectralView())) << '\n';
    return kExitOk;
}

}  // namespace

void addDemoCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<DemoOptions>();
    CLI::App* command = app.add_subcommand(
        "demo", "Start a service of its own, store credentials and show the spectrum for a while");
    command->add_option("--seconds", options->seconds, "How long; default 20")
        ->type_name("N")
        ->check(CLI::Range(1, 86400));
    command
        ->add_option("--service", options->service,
                     "The service's executable; default: the one that came with this program")
        ->type_name("PATH");
    command->add_flag("--json", options->json, "An event a line, as JSON, and a JSON object at the end");
    command->add_flag("--show-passwords", options->showPasswords, "Show the passwords too, in JSON");
    command->callback([options, &exitCode] { exitCode = runDemo(*options); });
}

}  // namespace vexa::client
