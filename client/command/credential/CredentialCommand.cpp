#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/credential/CredentialOutput.h"
#include "client/command/credential/CredentialSession.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

struct PlaceOptions {
    HotspotOptions hotspot;
    std::string which;
    int position = 0;
};

int runDelete(const PlaceOptions& options) {
    CredentialSession session(options.hotspot);
    CredentialStore& store = session.begin();
    const Credential stored = findCredential(store.list(), options.which);
    const std::size_t position = positionOf(store.list(), stored.id);
    store.erase(stored.id);
    session.report("deleted", "Deleted " + nameOf(stored) + ".", stored, position);
    return kExitOk;
}

int runMove(const PlaceOptions& options) {
    CredentialSession session(options.hotspot);
    CredentialStore& store = session.begin();
    const Credential stored = findCredential(store.list(), options.which);
    const std::size_t before = positionOf(store.list(), stored.id);
    const std::size_t now = store.move(stored.id, static_cast<std::size_t>(options.position));
    session.report(now == before ? "nothing" : "moved",
                   now == before ? "Nothing to move: " + nameOf(stored) + " is in position " +
                                       std::to_string(now) + " already."
                                 : "Moved " + nameOf(stored) + " from position " + std::to_string(before) +
                                       " to " + std::to_string(now) + ".",
                   stored, now);
    return kExitOk;
}

}  // namespace

void addCredentialDelete(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<PlaceOptions>();
    CLI::App* command = parent.add_subcommand("delete", "Delete a credential");
    command->add_option("WHICH", options->which, "Its id, or its name")->required();
    options->hotspot.addTo(*command, credentialChangeFields());
    command->callback([options, &exitCode] { exitCode = runDelete(*options); });
}

void addCredentialMove(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<PlaceOptions>();
    CLI::App* command = parent.add_subcommand("move", "Give a credential another priority");
    command->add_option("WHICH", options->which, "Its id, or its name")->required();
    command->add_option("POSITION", options->position, "Its place in the order of priority; 1 is the first")
        ->required()
        ->check(CLI::Range(1, 9999));
    options->hotspot.addTo(*command, credentialChangeFields());
    command->callback([options, &exitCode] { exitCode = runMove(*options); });
}

void addCredentialCommand(CLI::App& app, int& exitCode) {
    CLI::App* command = app.add_subcommand("credential", "Add, edit, delete or move a credential");
    command->require_subcommand(1);
    addCredentialAdd(*command, exitCode);
    addCredentialEdit(*command, exitCode);
    addCredentialDelete(*command, exitCode);
    addCredentialMove(*command, exitCode);
}

}  // namespace vexa::client
