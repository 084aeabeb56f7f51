#include "client/PortOption.h"

#include <CLI/CLI.hpp>

#include "client/ClientError.h"
#include "client/MachineFolder.h"
#include "client/ServicePorts.h"

namespace vexa::client {

void PortOption::addTo(CLI::App& command) {
    command.add_option("--sa-port,--port", port, "Port of the spectral analyser")
        ->type_name("N")
        ->check(CLI::Range(1, 65535))
        ->envname("VEXA_SA_PORT");
    command.add_option("--machine", machine, "Folder of the machine whose service is meant")
        ->type_name("DIR");
}

std::uint16_t PortOption::spectralPort() const {
    if (port != 0) return port;
    const MachineFolder folder(machine);
    const auto ports = readPortsFile(folder.portsFile());
    if (!ports) {
        throw ClientError("no service runs on the machine " + folder.path().string() +
                          ": start one with `vexa start`, or give --sa-port");
    }
    return ports->sa;
}

}  // namespace vexa::client
