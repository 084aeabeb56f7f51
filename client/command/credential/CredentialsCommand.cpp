#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/hotspot/CredentialStore.h"
#include "client/hotspot/CredentialText.h"
#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
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
    if (options.hotspot.json) {
        std::cout << jsonLine(credentialsJson(list, passwords)) << '\n';
    } else if (list.empty()) {
        std::cout << "No credentials are stored.\n";
    } else {
        for (const auto& line : credentialTable(list, passwords))
            std::cout << line << '\n';
    }
    return kExitOk;
}

int runReload(const HotspotOptions& options) {
    Signals signals;
    HotspotPort port(options.port.find(), signals, options.limit());
    CredentialStore store(port);
    const std::size_t count = store.reload().size();
    if (options.json) {
        Json::Value object(Json::objectValue);
        object["credentials"] = static_cast<Json::UInt64>(count);
        std::cout << jsonLine(object) << '\n';
    } else {
        std::cout << "The configuration was read again: " << counted(count, "credential") << ".\n";
    }
    return kExitOk;
}

}  // namespace

void addCredentialsCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<CredentialsOptions>();
    CLI::App* command =
        app.add_subcommand("credentials", "List the stored credentials in the order of priority");
    options->hotspot.addTo(*command);
    command->add_flag("--show-passwords", options->showPasswords, "Show the passwords too");
    command->callback([options, &exitCode] { exitCode = runCredentials(*options); });
}

void addReloadCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command =
        app.add_subcommand("reload", "Make the service read its configuration again, after an edit by hand");
    options->addTo(*command);
    command->callback([options, &exitCode] { exitCode = runReload(*options); });
}

}  // namespace vexa::client
