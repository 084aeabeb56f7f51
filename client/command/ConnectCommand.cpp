#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>

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

std::vector<std::string> quotedNames(const CredentialList& credentials) {
    std::vector<std::string> names;
    std::transform(credentials.begin(), credentials.end(), std::back_inserter(names),
                   [](const Credential& credential) { return inQuotes(credential.name); });
    return names;
}

class Joining {
public:
    explicit Joining(const ConnectionOptions& options)
        : m_options(options),
          m_port(options.hotspot.port.find(), m_signals, options.answerLimit()),
          m_name(inQuotes(options.network)) {}

    int run() {
        requireRadio(m_port);
        m_network = wantedNetwork();
        m_stored = askCredentials(m_port);
        m_fitting = fittingCredentials(m_stored, m_network);
        if (m_network.isConnected) return sayConnected("Already connected to ");
        // What was told until now says nothing of what comes.
        m_port.waitUntilHandled();
        tellOfNetwork(m_port, contract::kConnectNetwork, m_options.network);
        if (m_options.noWait) return sayAsked();
        JoinJudge judge(m_options.network);
        const Outcome outcome = awaitOutcome(m_port, judge, limit());
        if (outcome == Outcome::Joined) return sayConnected("Connected to ");
        throw ClientError(failure(outcome));
    }

private:
    Network wantedNetwork() {
        const NetworkList list = askNetworks(m_port).value_or(NetworkList());
        if (const Network* const network = findNetwork(list, m_options.network)) return *network;
        throw ClientError(whyNotFound(list));
    }

    std::string whyNotFound(const NetworkList& list) const {
        if (list.empty() && !hotspotSwitch(m_options.hotspot.port.machine()).value_or(true))
            return "hotspot networks are disabled: `vexa enable` enables them";
        return "no network " + m_name + " is in range" + (list.empty() ? "" : "; there is " + namesOf(list));
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
        if (!m_network.hasRealms) return "nothing came of it: the realms of " + m_name + " are not known yet";
        if (m_fitting.empty())
            return "no stored credential fits " + m_name + ", and the system did not join it by itself";
        return m_name + " was not joined within " + std::to_string(m_options.hotspot.timeout) + " s";
    }

    const ConnectionOptions& m_options;
    Signals m_signals;
    HotspotPort m_port;
    std::string m_name;
    Network m_network;
    CredentialList m_stored;
    CredentialList m_fitting;
};

}  // namespace

void addConnectCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ConnectionOptions>();
    CLI::App* command = app.add_subcommand("connect", "Join a network, with each credential that fits it");
    command->add_option("NAME", options->network, "Name of the network")->required();
    options->addTo(*command, kDefaultTimeout,
                   {{{"done", "Done"},
                     {"network", "Network"},
                     {"credentials", "Credentials"},
                     {"internet", "Internet"}}});
    command->callback([options, &exitCode] { exitCode = Joining(*options).run(); });
}

}  // namespace vexa::client
