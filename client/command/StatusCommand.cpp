#include <CLI/CLI.hpp>
#include <cstdlib>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/hotspot/Fitting.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/machine/ServicePorts.h"
#include "client/port/HotspotPort.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"
#include "contract/Version.h"

namespace vexa::client {

namespace {

constexpr const char* kNotKnown = "not known";

struct Status {
    bool hasAdapter = false;
    bool isRadioOn = false;
    std::optional<bool> hotspot;
    std::optional<NetworkList> networks;
    std::optional<bool> internet;
    /// Those with which the connection can have been made.
    std::vector<std::string> credentials;
    /// Of the network that the adapter is connected to; 0: none.
    std::optional<int> channel;
    ServicePorts ports;
    std::string machine;
};

/// Nothing if the spectral half does not tell.
std::optional<int> askChannel(std::uint16_t number, Signals& signals, std::chrono::seconds limit) try {
    HotspotPort port(number, signals, limit);
    port.tell(contract::kGetCurrentChannel);
    const Deadline end = Deadline::in(limit);
    while (const auto event = port.next(end)) {
        if (event->id == contract::kCurrentChannelData) return std::atoi(event->data.c_str());
    }
    return std::nullopt;
} catch (const StoppedByUser&) {
    throw;
} catch (const ClientError&) {
    return std::nullopt;
}

/// What the folder of the machine tells, and its spectral half.
void askMachine(Status& status, const HotspotOptions& options, Signals& signals) {
    status.ports.hs20 = options.port.find();
    const auto machine = options.port.machine();
    if (!machine) return;
    status.machine = machine->path().string();
    status.ports = readPortsFile(machine->portsFile()).value_or(status.ports);
    if (status.ports.sa != 0) status.channel = askChannel(status.ports.sa, signals, options.limit());
}

Status askStatus(HotspotPort& port, const HotspotOptions& options) {
    Status status;
    status.hotspot = hotspotSwitch(options.port.machine());
    status.hasAdapter = port.hasAdapter();
    if (!status.hasAdapter) return status;
    status.isRadioOn = askRadio(port);
    status.networks = askNetworks(port);
    status.internet = askInternet(port);
    const NetworkList networks = status.networks.value_or(NetworkList());
    if (const Network* connected = connectedNetwork(networks))
        status.credentials = credentialsOf(*connected, askCredentials(port), options.port.machine());
    return status;
}

std::string channelText(std::optional<int> channel) {
    if (!channel) return kNotKnown;
    return *channel == 0 ? "none" : std::to_string(*channel);
}

std::string numberText(int number) {
    return number == 0 ? kNotKnown : std::to_string(number);
}

std::string flagText(const std::optional<bool>& flag, const char* yes, const char* no) {
    if (!flag) return kNotKnown;
    return *flag ? yes : no;
}

std::string credentialText(const Status& status, const Network* connected) {
    if (connected != nullptr && status.credentials.empty()) return "none of ours";
    return connected == nullptr ? "none" : alternatives(status.credentials);
}

std::vector<std::string> statusLines(const Status& status) {
    const NetworkList networks = status.networks.value_or(NetworkList());
    const Network* connected = connectedNetwork(networks);
    return alignedLines(
        {{"Adapter", status.hasAdapter ? "in" : "out"},
         {"Radio", status.isRadioOn ? "on" : "off"},
         {"Hotspot", flagText(status.hotspot, "enabled", "disabled")},
         {"Networks", std::to_string(networks.size())},
         {"Connection", connected == nullptr ? "none" : connected->name},
         {"Credential", credentialText(status, connected)},
         {"Internet", status.internet.value_or(false) ? "yes" : "no"},
         {"Channel", channelText(status.channel)},
         {"Ports", "sa " + numberText(status.ports.sa) + ", hs20 " + numberText(status.ports.hs20)},
         {"Machine", status.machine.empty() ? kNotKnown : status.machine},
         {"Version", contract::version()}});
}

Json::Value flagJson(const std::optional<bool>& flag) {
    return flag ? Json::Value(*flag) : Json::Value();
}

Json::Value numberJson(int number) {
    return number == 0 ? Json::Value() : Json::Value(number);
}

Json::Value statusJson(const Status& status) {
    const NetworkList networks = status.networks.value_or(NetworkList());
    const Network* connected = connectedNetwork(networks);
    Json::Value object(Json::objectValue);
    object["adapter"] = status.hasAdapter;
    object["radio"] = status.isRadioOn;
    object["hotspot"] = flagJson(status.hotspot);
    object["networks"] = static_cast<Json::UInt64>(networks.size());
    object["connection"] = connected == nullptr ? Json::Value() : Json::Value(connected->name);
    object["credential"] = Json::Value();
    if (status.credentials.size() == 1) object["credential"] = status.credentials.front();
    object["possibleCredentials"] = Json::Value(Json::arrayValue);
    for (const std::string& name : status.credentials)
        object["possibleCredentials"].append(name);
    object["internet"] = status.internet.value_or(false);
    object["channel"] = status.channel ? Json::Value(*status.channel) : Json::Value();
    object["ports"]["sa"] = numberJson(status.ports.sa);
    object["ports"]["hs20"] = numberJson(status.ports.hs20);
    object["machine"] = status.machine.empty() ? Json::Value() : Json::Value(status.machine);
    object["version"] = contract::version();
    return object;
}

FieldList statusFields() {
    return {{{"adapter", "Adapter"},
             {"radio", "Radio"},
             {"hotspot", "Hotspot"},
             {"networks", "Networks"},
             {"connection", "Connection"},
             {"credential", "Credential"},
             {"possibleCredentials", "Possible credentials"},
             {"internet", "Internet"},
             {"channel", "Channel"},
             {"ports.sa", "Spectral port"},
             {"ports.hs20", "Hotspot port"},
             {"machine", "Machine"},
             {"version", "Version"}}};
}

int runStatus(const HotspotOptions& options) {
    Signals signals;
    HotspotPort port(options.port.find(), signals, options.limit());
    Status status = askStatus(port, options);
    askMachine(status, options, signals);
    print(options, statusJson(status), statusLines(status));
    return kExitOk;
}

}  // namespace

void addStatusCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command = app.add_subcommand(
        "status", "Tell of the adapter, its radio, the hotspot switch, the connection and the service");
    options->addTo(*command, statusFields());
    command->callback([options, &exitCode] { exitCode = runStatus(*options); });
}

}  // namespace vexa::client
