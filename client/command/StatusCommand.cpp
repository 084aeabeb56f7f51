#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/hotspot/Fitting.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/port/HotspotPort.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

struct Status {
    bool hasAdapter = false;
    bool isRadioOn = false;
    std::optional<bool> hotspot;
    std::optional<NetworkList> networks;
    std::optional<bool> internet;
    /// Those with which the connection can have been made.
    std::vector<std::string> credentials;
};

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

std::string flagText(const std::optional<bool>& flag, const char* yes, const char* no) {
    if (!flag) return "not known";
    return *flag ? yes : no;
}

std::string credentialText(const Status& status, const Network* connected) {
    if (connected != nullptr && status.credentials.empty()) return "none of ours";
    return connected == nullptr ? "none" : alternatives(status.credentials);
}

std::vector<std::string> statusLines(const Status& status) {
    const NetworkList networks = status.networks.value_or(NetworkList());
    const Network* connected = connectedNetwork(networks);
    return alignedLines({{"Adapter", status.hasAdapter ? "in" : "out"},
                         {"Radio", status.isRadioOn ? "on" : "off"},
                         {"Hotspot", flagText(status.hotspot, "enabled", "disabled")},
                         {"Networks", std::to_string(networks.size())},
                         {"Connection", connected == nullptr ? "none" : connected->name},
                         {"Credential", credentialText(status, connected)},
                         {"Internet", status.internet.value_or(false) ? "yes" : "no"}});
}

Json::Value flagJson(const std::optional<bool>& flag) {
    return flag ? Json::Value(*flag) : Json::Value();
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
    return object;
}

int runStatus(const HotspotOptions& options) {
    Signals signals;
    HotspotPort port(options.port.find(), signals, options.limit());
    const Status status = askStatus(port, options);
    print(options, statusJson(status), statusLines(status));
    return kExitOk;
}

}  // namespace

void addStatusCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command =
        app.add_subcommand("status", "Tell of the adapter, its radio, the hotspot switch and the connection");
    options->addTo(*command, {{{"adapter", "Adapter"},
                               {"radio", "Radio"},
                               {"hotspot", "Hotspot"},
                               {"networks", "Networks"},
                               {"connection", "Connection"},
                               {"credential", "Credential"},
                               {"possibleCredentials", "Possible credentials"},
                               {"internet", "Internet"}}});
    command->callback([options, &exitCode] { exitCode = runStatus(*options); });
}

}  // namespace vexa::client
