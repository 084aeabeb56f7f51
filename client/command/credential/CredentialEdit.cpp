#include <CLI/CLI.hpp>
#include <array>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/credential/CredentialChoice.h"
#include "client/command/credential/CredentialFields.h"
#include "client/command/credential/CredentialOutput.h"
#include "client/command/credential/CredentialSession.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/PasswordPrompt.h"

namespace vexa::client {

namespace {

struct EditOptions {
    HotspotOptions hotspot;
    CredentialFields fields;
    CredentialChoice choice;
    bool askPassword = false;
};

struct TextNoun {
    const char* noun;
    std::string Credential::*field;
};
constexpr std::array kNouns{TextNoun{"name", &Credential::name},
                            TextNoun{"realm", &Credential::realm},
                            TextNoun{"user name", &Credential::username},
                            TextNoun{"password", &Credential::password},
                            TextNoun{"CA certificate", &Credential::caCert},
                            TextNoun{"client certificate", &Credential::clientCert}};

/// As in "name, password".
std::string differences(const Credential& before, const Credential& after) {
    std::string text;
    const auto append = [&](const char* noun) { text += (text.empty() ? "" : ", ") + std::string(noun); };
    for (const TextNoun& member : kNouns) {
        if (before.*member.field != after.*member.field) append(member.noun);
    }
    if (before.autoConnect != after.autoConnect) append("auto-connect");
    return text;
}

std::optional<std::string> newPassword(const EditOptions& options, Signals& signals) {
    if (options.askPassword) return askPassword(signals);
    if (options.fields.passwordFromInput) return readPassword(signals);
    return std::nullopt;
}

Credential wantedCredential(const EditOptions& options, const Credential& stored,
                            const std::optional<std::string>& password) {
    if (stored.type != kTypeUser && stored.type != kTypeCertificate)
        throw ClientError(nameOf(stored) + " is of a kind that cannot be edited");
    if (password && stored.type != kTypeUser)
        throw ClientError(methodName(stored) + " has no password", kExitWrongUse);
    Credential wanted = stored;
    options.fields.applyTo(wanted);
    if (password) wanted.password = *password;
    options.fields.checkAgainst(wanted);
    checkText(wanted);
    return wanted;
}

int runEdit(const EditOptions& options) {
    if (options.fields.isEmpty() && !options.askPassword)
        throw ClientError("nothing to change was given", kExitWrongUse);
    options.choice.check();
    CredentialSession session(options.hotspot);
    const auto password = newPassword(options, session.signals());
    CredentialStore& store = session.begin();
    const Credential stored = options.choice.findIn(store.list());
    const Credential wanted = wantedCredential(options, stored, password);
    const std::string changed = differences(stored, wanted);
    if (!changed.empty()) store.edit(wanted);
    session.report(changed.empty() ? "nothing" : "edited",
                   changed.empty() ? "Nothing to change: " + nameOf(stored) + " is like that already."
                                   : "Changed " + nameOf(wanted) + ": " + changed + ".",
                   wanted, positionOf(store.list(), wanted.id));
    return kExitOk;
}

}  // namespace

void addCredentialEdit(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<EditOptions>();
    CLI::App* command = parent.add_subcommand("edit", "Change a credential; what is not given stays");
    options->choice.addTo(*command, false);
    options->hotspot.addTo(*command, credentialChangeFields());
    options->fields.addTo(*command);
    command->add_flag("--ask-password", options->askPassword, "Ask for a new password")
        ->excludes(command->get_option("--password-stdin"));
    command->callback([options, &exitCode] { exitCode = runEdit(*options); });
}

}  // namespace vexa::client
