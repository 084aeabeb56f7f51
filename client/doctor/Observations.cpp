#include "client/doctor/Observations.h"

#include "client/hotspot/HotspotQuestions.h"
#include "client/machine/LogFiles.h"
#include "client/machine/LogSwitch.h"
#include "client/port/HotspotPort.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

namespace fs = std::filesystem;

// Some fifty rounds of choosing, in which every state has been told of again.
constexpr std::uintmax_t kLogEnd = std::uintmax_t{256} << 10;

// What the log tells is of a service that runs.
constexpr const char* kNotAsked = "the service was not asked";
constexpr const char* kUnknownMachine = "the folder of its machine is not known";

void askService(HotspotPort& port, const std::optional<MachineFolder>& machine, Observations& seen) {
    seen.hasAdapter = port.hasAdapter();
    if (!*seen.hasAdapter) return;
    seen.isRadioOn = askRadio(port);
    seen.networks = askNetworks(port);
    seen.credentials = askCredentials(port);
    seen.hasInternet = askInternet(port);
    const NetworkList networks = seen.networks.value_or(NetworkList());
    if (const Network* const connected = connectedNetwork(networks))
        seen.connectedWith = credentialsOf(*connected, *seen.credentials, machine);
}

// A file that was written last before the service had started is that of another run.
void readLog(const std::optional<MachineFolder>& machine, Observations& seen) {
    seen.whyNoLog = machine ? whyLogIsOff(*machine) : kUnknownMachine;
    if (!seen.whyNoLog.empty()) return;
    std::error_code error;
    const auto start = fs::last_write_time(machine->portsFile(), error);
    const auto lines = LogFiles(machine->dumpFolder()).lastLines(kLogEnd, start);
    if (lines.empty())
        seen.whyNoLog = "the log is on, but nothing of this run is in it yet; lines come every 10 s";
    else
        seen.log = logFacts(lines);
}

}  // namespace

Observations observe(std::uint16_t port, Signals& signals, std::chrono::milliseconds limit,
                     const std::optional<MachineFolder>& machine) {
    Observations seen;
    seen.isHotspotOn = hotspotSwitch(machine);
    readLog(machine, seen);
    try {
        HotspotPort connection(port, signals, limit);
        askService(connection, machine, seen);
    } catch (const StoppedByUser&) {
        throw;
    } catch (const ClientError& error) {
        seen.serviceTrouble = error.what();
        seen.log.reset();
        seen.whyNoLog = kNotAsked;
    }
    return seen;
}

}  // namespace vexa::client
