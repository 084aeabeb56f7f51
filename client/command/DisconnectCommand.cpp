#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/ConnectionOptions.h"
#include "client/hotspot/ConnectionWait.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

constexpr int kDefaultTimeout = 10;
// An attempt that is under way ends at once, or there was none.
constexpr std::chrono::seconds kAttemptLimit{3};

constexpr const char* kStaysAway = "; the service stays away from it until you connect to it.";

/// The network that is meant; without a name the connected one.
std::string networkToLeave(const ConnectionOptions& options, const NetworkList& list) {
    const Network* const network =
        options.network.empty() ? connectedNetwork(list) : networkMeant(list, options.network);
    if (network != nullptr) return network->name;
    if (options.network.empty()) throw ClientError("no hotspot network is connected");
    return options.network;
}

std::string notLeft(Outcome outcome, bool wasConnected, const ConnectionOptions& options,
                    const Network* connected) {
    const std::string name = inQuotes(options.network);
    if (outcome != Outcome::Open) return reasonOf(outcome, options.network);
    if (wasConnected) return name + " was not left within " + std::to_string(options.hotspot.timeout) + " s";
    return name + " is not connected" +
           (connected == nullptr ? "" : ": " + inQuotes(connected->name) + " is");
}

int runDisconnect(ConnectionOptions& options) {
    Signals signals;
    HotspotPort port(options.hotspot.port.find(), signals, options.answerLimit());
    requireRadio(port);
    const NetworkList list = askNetworks(port).value_or(NetworkList());
    const Network* const connected = connectedNetwork(list);
    options.network = networkToLeave(options, list);
    const bool isConnected = connected != nullptr && connected->name == options.network;
    // What was told until now says nothing of what comes.
    port.waitUntilHandled();
    tellOfNetwork(port, contract::kDisconnectNetwork, options.network);
    const std::string name = inQuotes(options.network);
    if (options.noWait) {
        port.waitUntilHandled();
        sayDone(options, "asked", "The service was asked to leave " + name + ".");
        return kExitOk;
    }
    LeaveJudge judge(options.network, isConnected);
    const auto limit =
        isConnected ? options.hotspot.limit() : std::min(options.hotspot.limit(), kAttemptLimit);
    const Outcome outcome = awaitOutcome(port, judge, limit);
    if (outcome != Outcome::Left && outcome != Outcome::Ended)
        throw ClientError(notLeft(outcome, isConnected, options, connected));
    sayDone(options, "disconnected",
            (outcome == Outcome::Left ? "Left " : "Ended the attempt to join ") + name + kStaysAway);
    return kExitOk;
}

}  // namespace

void addDisconnectCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ConnectionOptions>();
    CLI::App* command = app.add_subcommand(
        "disconnect", "Leave a network; the service does not join it again until it is asked to");
    command->add_option("NAME", options->network, "Name of the network; default: the connected one");
    options->addTo(*command, kDefaultTimeout, {{{"done", "Done"}, {"network", "Network"}}});
    command->callback([options, &exitCode] { exitCode = runDisconnect(*options); });
}

}  // namespace vexa::client
