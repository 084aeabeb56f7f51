#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>
#include <utility>

#include "client/command/Commands.h"
#include "client/command/ConnectionOptions.h"
#include "client/hotspot/ConnectionWait.h"
#include "client/hotspot/Fitting.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

// Each credential may take some seconds, a certificate twice, behind an attempt that runs already.
constexpr int kDefaultTimeout = 60;
// The service tells nothing of an attempt that it leaves to the system.
constexpr std::chrono::seconds kSilentLimit{10};

struct JoinOptions : ConnectionOptions {
    bool anyway = false;
};

std::vector<std::string> quotedNames(const CredentialList& credentials) {
    std::vector<std::string> names;
    std::transform(credentials.begin(), credentials.end(), std::back_inserter(names),
                   [](const Credential& credential) { return inQuotes(credential.name); });
    return names;
}

class Joining {
public:
    explicit Joining(JoinOptions options)
        : m_options(std::move(options)),
          m_port(m_options.hotspot.port.find(), m_signals, m_options.answerLimit()),
          m_name(inQuotes(m_options.network)) {}

    int run() {
        requireRadio(m_port);
        m_network = wantedNetwork();
        m_stored = askCredentials(m_port);
        m_fitting = fittingCredentials(m_stored, m_network);
        if (m_network.isConnected) return sayConnected("Already connected to ");
        requireChance();
        // What was told until now says nothing of what comes.
        m_port.waitUntilHandled();
        tellOfNetwork(m_port, contract::kConnectNetwork, m_options.network);
        if (m_options.noWait) return sayAsked();
        JoinJudge judge(m_options.network);
        const Outcome outcome = awaitOutcome(m_port, judge, limit());
        if (outcome == Outcome::Joined) return sayConnected("Connected to ");
        throw ClientError(failure(outcome) + whatEnded(outcome));
    }

private:
    Network wantedNetwork() {
        const NetworkList list = askNetworks(m_port).value_or(NetworkList());
        if (const Network* const connected = connectedNetwork(list)) m_connectedBefore = connected->name;
        const Network* const network = networkMeant(list, m_options.network);
        if (network == nullptr) throw ClientError(whyNotFound(list));
        m_options.network = network->name;
        return *network;
    }

    std::string whyNotFound(const NetworkList& list) const {
        if (list.empty() && !hotspotSwitch(m_options.hotspot.port.machine()).value_or(true))
            return "hotspot networks are disabled: `vexa enable` enables them";
        return "no network " + m_name + " is in range" +
               (list.empty() ? "" : "; there is " + namesLike(list, m_options.network));
    }

    // Without one that fits the service leaves it to the system, which ends the connection that there is
    // first.
    void requireChance() const {
        if (!m_network.hasRealms) throw ClientError("the realms of " + m_name + " are not known yet");
        if (m_fitting.empty() && !m_options.anyway)
            throw ClientError("no stored credential fits " + m_name +
                              ": with --anyway the system is asked to join it by itself");
    }

    std::chrono::seconds limit() const {
        return m_fitting.empty() ? std::min(m_options.hotspot.limit(), kSilentLimit)
                                 : m_options.hotspot.limit();
    }

    int sayAsked() {
        m_port.waitUntilHandled();
        sayDone(m_options, "asked", "The service was asked to join " + m_name + ".");
        return kExitOk;
    }

    int sayConnected(const char* beginning) {
        const auto names = credentialsOf(m_network, m_stored, m_options.hotspot.port.machine());
        const bool hasInternet = askInternet(m_port).value_or(false);
        Json::Value details(Json::objectValue);
        details["credentials"] = Json::Value(Json::arrayValue);
        for (const std::string& name : names)
            details["credentials"].append(name);
        details["internet"] = hasInternet;
        sayDone(
            m_options, "connected",
            beginning + m_name + withOneOf(names) + (hasInternet ? "." : "; it does not reach the internet."),
            details);
        return kExitOk;
    }

    std::string failure(Outcome outcome) const {
        if (outcome == Outcome::Refused)
            return "could not join " + m_name + " with " + alternatives(quotedNames(m_fitting));
        if (outcome != Outcome::Open) return reasonOf(outcome, m_options.network);
        if (m_fitting.empty())
            return "no stored credential fits " + m_name + ", and the system did not join it by itself";
        return m_name + " was not joined within " + std::to_string(m_options.hotspot.timeout) + " s";
    }

    std::string whatEnded(Outcome outcome) {
        if (m_connectedBefore.empty() || outcome == Outcome::AdapterOut) return "";
        const NetworkList now = askNetworks(m_port).value_or(NetworkList());
        const Network* const connected = connectedNetwork(now);
        if (connected != nullptr && connected->name == m_connectedBefore) return "";
        return "; the connection to " + inQuotes(m_connectedBefore) + " has ended";
    }

    JoinOptions m_options;
    Signals m_signals;
    HotspotPort m_port;
    std::string m_name;
    std::string m_connectedBefore;
    Network m_network;
    CredentialList m_stored;
    CredentialList m_fitting;
};

}  // namespace

void addConnectCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<JoinOptions>();
    CLI::App* command = app.add_subcommand("connect", "Join a network, with each credential that fits it");
    command->add_option("NAME", options->network, "Name of the network")->required();
    options->addTo(*command, kDefaultTimeout,
                   {{{"done", "Done"},
                     {"network", "Network"},
                     {"credentials", "Credentials"},
                     {"internet", "Internet"}}});
    command->add_flag("--anyway", options->anyway,
                      "Leave it to the system where no credential fits; that ends the connection there is");
    command->callback([options, &exitCode] { exitCode = Joining(*options).run(); });
}

}  // namespace vexa::client
