#include "client/command/PortOption.h"

#include <CLI/CLI.hpp>

#include "client/machine/MachineFolder.h"
#include "client/machine/ServiceHost.h"
#include "client/machine/ServicePorts.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr const char* kMachineDescription = "Folder of the machine whose service is meant";

constexpr const char* kSpectralName = "sa";
constexpr const char* kHotspotName = "hs20";

struct HalfNames {
    const char* option;
    const char* variable;
    const char* description;
    std::uint16_t ServicePorts::*port;
};

const HalfNames& namesOf(Half half) {
    static constexpr HalfNames kSpectral{"--sa-port", "VEXA_SA_PORT", "Port of the spectral analyser",
                                         &ServicePorts::sa};
    static constexpr HalfNames kHotspot{"--hs20-port", "VEXA_HS20_PORT", "Port of the hotspot half",
                                        &ServicePorts::hs20};
    return half == Half::Spectral ? kSpectral : kHotspot;
}

}  // namespace

void PortOption::addTo(CLI::App& command) {
    addPortTo(command, ",--port");
    if (!hasSimulatedMachines()) return;
    command.add_option("--machine", m_machine, kMachineDescription)->type_name("DIR");
}

void PortOption::addBothTo(CLI::App& command, PortOption& spectral, PortOption& hotspot) {
    spectral.addPortTo(command, "");
    hotspot.addPortTo(command, "");
    if (!hasSimulatedMachines()) return;
    const auto setMachine = [&spectral, &hotspot](const std::string& folder) {
        spectral.m_machine = hotspot.m_machine = folder;
    };
    command.add_option_function<std::string>("--machine", setMachine, kMachineDescription)->type_name("DIR");
}

void PortOption::addPortTo(CLI::App& command, const std::string& alias) {
    const HalfNames& names = namesOf(m_half);
    command.add_option(names.option + alias, m_port, names.description)
        ->type_name("N")
        ->check(CLI::Range(1, 65535))
        ->envname(names.variable);
}

void PortOption::setMachine(const std::string& folder) {
    m_machine = folder;
    m_port = 0;
}

std::uint16_t PortOption::find() const {
    if (m_port != 0) return m_port;
    const MachineFolder folder(m_machine);
    const auto ports = readPortsFile(folder.portsFile());
    if (!ports) {
        throw ClientError("no service runs on the machine " + folder.path().string() +
                          ": start one with `vexa start`, or give " + namesOf(m_half).option);
    }
    return (*ports).*namesOf(m_half).port;
}

std::optional<MachineFolder> PortOption::machine() const try {
    MachineFolder folder(m_machine);
    if (m_port == 0) return folder;
    const auto ports = readPortsFile(folder.portsFile());
    if (!ports || (*ports).*namesOf(m_half).port != m_port) return std::nullopt;
    return folder;
} catch (const ClientError&) {  // nothing tells of a folder
    return std::nullopt;
}

void PortArgument::addTo(CLI::App& command) {
    command
        .add_option("PORT", m_given,
                    "Port of the spectral analyser or of the hotspot half: a number, `sa` or `hs20`")
        ->required()
        ->check((CLI::IsMember({kSpectralName, kHotspotName}) | CLI::Range(1, 65535)).description(""));
    PortOption::addBothTo(command, m_spectral, m_hotspot);
}

std::uint16_t PortArgument::find() const {
    if (m_given == kSpectralName) return m_spectral.find();
    if (m_given == kHotspotName) return m_hotspot.find();
    return static_cast<std::uint16_t>(std::stoi(m_given));
}

}  // namespace vexa::client
