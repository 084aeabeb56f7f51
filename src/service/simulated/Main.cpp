// The service as a process of a simulated Windows machine.

#include <algorithm>
#include <charconv>
#include <csignal>
#include <cstdlib>
#include <iostream>
#include <memory>
#include <optional>
#include <string>

#include "platform/ClockControl.h"
#include "platform/posix/MachineFolder.h"
#include "platform/posix/OwnerFiles.h"
#include "service/Service.h"
#include "simulation/Machine.h"
#include "simulation/control/ControlServer.h"
#include "simulation/control/Timeline.h"
#include "simulation/scenario/DemoScenario.h"
#include "simulation/text/Text.h"

namespace {

using vexa::simulation::Machine;
using vexa::simulation::Scenario;

constexpr int kBadSetup = 2;

// Both live to the end of the process: exit routines and threads that come late still call the machine.
Machine* theMachine = nullptr;
std::shared_ptr<vexa::IpcWebSocketServer>* theControlServer = nullptr;

const char* environment(const char* name) {
    const char* const value = std::getenv(name);  // NOLINT(concurrency-mt-unsafe): before the first thread
    return value && *value ? value : nullptr;
}

int complain(std::string line) {
    std::replace_if(
        line.begin(), line.end(), [](char c) { return c == '\n' || c == '\r'; }, ' ');
    std::cerr << line + "\n";
    return kBadSetup;
}

// Only the parent stops the service.
void ignoreSignals() {
    for (const int signal : {SIGINT, SIGHUP, SIGPIPE})
        std::signal(signal, SIG_IGN);
}

std::string scenarioText(const std::filesystem::path& folder) {
    const char* const named = environment("VEXA_SCENARIO");
    const std::filesystem::path path = named ? std::filesystem::path(named) : folder / "scenario.json";
    std::error_code error;
    if (!named && !std::filesystem::exists(path, error)) return std::string(vexa::simulation::demoScenario());
    auto text = vexa::posix::readFile(path);
    if (!text) throw vexa::simulation::JsonFault(path.string() + ": can't be read");
    return *std::move(text);
}

void buildMachine(const std::filesystem::path& folder) {
    Scenario scenario = vexa::simulation::parseScenario(scenarioText(folder));
    vexa::platform::setClockSpeed(scenario.speed);
    theMachine = std::make_unique<Machine>(std::move(scenario), folder).release();
    vexa::simulation::beginTimeline(*theMachine);
}

std::optional<std::int32_t> portNumber(std::string_view text) {
    std::int32_t port = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), port);
    if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
    return port;
}

bool startControl(const char* portText) {
    const auto port = portNumber(portText);
    auto server = port ? vexa::simulation::startControlServer(*theMachine, *port) : nullptr;
    if (!server) return false;
    theControlServer =
        std::make_unique<std::shared_ptr<vexa::IpcWebSocketServer>>(std::move(server)).release();
    return true;
}

void stopMachine() {
    theMachine->stop();
    if (theControlServer) (*theControlServer)->stop();
}

std::wstring commandLine(int count, char** arguments) {
    std::wstring line;
    for (int i = 1; i < count; ++i) {
        if (i > 1) line += L' ';
        const std::u32string argument = vexa::simulation::codePoints(arguments[i]);
        line.append(argument.begin(), argument.end());
    }
    return line;
}

}  // namespace

int main(int argc, char** argv) {
    const std::wstring line = commandLine(argc, argv);
    if (vexa::tellVersion(line)) return 0;
    ignoreSignals();
    const std::filesystem::path folder = vexa::posix::machineFolder();
    if (folder.empty()) return complain("no machine folder: set VEXA_MACHINE or HOME");
    try {
        buildMachine(folder);
    } catch (const vexa::simulation::JsonFault& fault) {
        return complain(fault.what());
    }
    // Exit routines run in reverse: those of the service, which come later, still find the machine at work.
    std::atexit(stopMachine);
    const char* const controlPort = environment("VEXA_CONTROL_PORT");
    if (controlPort && !startControl(controlPort)) {
        return complain(std::string("control channel: can't be opened on port ") + controlPort);
    }
    return vexa::runService(argc > 1 ? &line : nullptr);
}
