#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/credential/CredentialFields.h"
#include "client/command/credential/CredentialOutput.h"
#include "client/command/credential/CredentialSession.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/PasswordPrompt.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

struct AddOptions {
    HotspotOptions hotspot;
    CredentialFields fields;
    std::string method = "ttls";
    std::string creator;
    bool perUser = false;
};

Credential wantedCredential(const AddOptions& options) {
    Credential credential;
    const bool isUser = options.method == "ttls";
    credential.type = isUser ? kTypeUser : kTypeCertificate;
    credential.method = isUser ? kMethodTtls : kMethodTls;
    credential.access = options.perUser ? kPerUser : kAllUsers;
    credential.autoConnect = true;
    credential.creator = options.creator;
    options.fields.applyTo(credential);
    return credential;
}

int runAdd(const AddOptions& options) {
    Credential wanted = wantedCredential(options);
    options.fields.checkAgainst(wanted);
    checkText(wanted);
    CredentialSession session(options.hotspot);
    if (wanted.type == kTypeUser) {
        wanted.password = options.fields.passwordFromInput ? readPassword(session.signals())
                                                           : askPassword(session.signals());
        checkText(wanted);
    }
    CredentialStore& store = session.begin();
    const Credential& added = store.add(wanted);
    const std::size_t position = positionOf(store.list(), added.id);
    session.report("added",
                   "Added " + nameOf(added) + " for the realm " + inQuotes(added.realm) + ", in position " +
                       std::to_string(position) + " of " + std::to_string(store.list().size()) + ".",
                   added, position);
    return kExitOk;
}

}  // namespace

void addCredentialAdd(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<AddOptions>();
    CLI::App* command = parent.add_subcommand("add", "Store a credential; it goes before all others");
    options->hotspot.addTo(*command, credentialChangeFields());
    options->fields.addTo(*command);
    command
        ->add_option("--method", options->method,
                     "ttls: user name and password, asked for; tls: certificates; default ttls")
        ->check(CLI::IsMember({"ttls", "tls"}, CLI::ignore_case));
    command->add_option("--creator", options->creator, "Who stores it; default: the account of the service")
        ->type_name("TEXT");
    CLI::Option* perUser = command->add_flag("--per-user", options->perUser, "For this user alone");
    command
        ->add_flag_callback(
            "--all-users", [] {}, "For all users of the machine; the default")
        ->excludes(perUser);
    command->callback([options, &exitCode] { exitCode = runAdd(*options); });
}

}  // namespace vexa::client
