#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/command/credential/CredentialOutput.h"
#include "client/hotspot/CredentialStore.h"
#include "client/hotspot/CredentialText.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/LineFit.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

struct CredentialsOptions {
    HotspotOptions hotspot;
    bool showPasswords = false;
};

int runCredentials(const CredentialsOptions& options) {
    Signals signals;
    HotspotPort port(options.hotspot.port.find(), signals, options.hotspot.limit());
    CredentialStore store(port);
    const CredentialList& list = store.read();
    const Passwords passwords = options.showPasswords ? Passwords::Shown : Passwords::Hidden;
    print(options.hotspot, credentialsJson(list, passwords),
          list.empty() ? std::vector<std::string>{"No credentials are stored."}
                       : credentialTable(list, passwords, lineRoom()));
    return kExitOk;
}

int runReload(const HotspotOptions& options) {
    Signals signals;
    HotspotPort port(options.port.find(), signals, options.limit());
    CredentialStore store(port, options.port.machine());
    const std::size_t count = store.reload().size();
    Json::Value object(Json::objectValue);
    object["credentials"] = static_cast<Json::UInt64>(count);
    print(options, object, "The configuration was read again: " + counted(count, "credential") + ".");
    return kExitOk;
}

void addList(CLI::App& parent, const char* name, int& exitCode) {
    auto options = std::make_shared<CredentialsOptions>();
    CLI::App* command = parent.add_subcommand(name, "List the stored credentials in the order of priority");
    options->hotspot.addTo(*command, credentialListFields());
    command->add_flag("--show-passwords", options->showPasswords, "Show the passwords too");
    command->callback([options, &exitCode] { exitCode = runCredentials(*options); });
}

}  // namespace

void addCredentialsCommand(CLI::App& app, int& exitCode) {
    addList(app, "credentials", exitCode);
}

void addCredentialList(CLI::App& parent, int& exitCode) {
    addList(parent, "list", exitCode);
}

void addReloadCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command =
        app.add_subcommand("reload", "Make the service read its configuration again, after an edit by hand");
    options->addTo(*command, {{{"credentials", "Credentials"}}});
    command->callback([options, &exitCode] { exitCode = runReload(*options); });
}

}  // namespace vexa::client
