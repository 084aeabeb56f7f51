#include <CLI/CLI.hpp>
#include <charconv>
#include <memory>
#include <utility>

#include "client/command/Commands.h"
#include "client/command/credential/CredentialChoice.h"
#include "client/command/credential/CredentialOutput.h"
#include "client/command/credential/CredentialSession.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr int kLastPosition = 9999;

struct PlaceOptions {
    HotspotOptions hotspot;
    CredentialChoice choice;
    std::optional<std::string> position;
};

std::size_t wantedPosition(const std::string& text) {
    int position = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), position);
    if (error == std::errc() && end == text.data() + text.size() && position >= 1 &&
        position <= kLastPosition)
        return static_cast<std::size_t>(position);
    throw ClientError("POSITION is to be a number from 1 to " + std::to_string(kLastPosition), kExitWrongUse);
}

int runDelete(const PlaceOptions& options) {
    options.choice.check();
    CredentialSession session(options.hotspot);
    CredentialStore& store = session.begin();
    const Credential stored = options.choice.findIn(store.list());
    const std::size_t position = positionOf(store.list(), stored.id);
    store.erase(stored.id);
    session.report("deleted", "Deleted " + nameOf(stored) + ".", stored, position);
    return kExitOk;
}

// Where the credential is named by an option, the only word is the position.
int runMove(PlaceOptions& options) {
    if (!options.position && (options.choice.id || options.choice.name))
        std::swap(options.position, options.choice.which);
    options.choice.check();
    const std::size_t wanted = wantedPosition(options.position.value_or(""));
    CredentialSession session(options.hotspot);
    CredentialStore& store = session.begin();
    const Credential stored = options.choice.findIn(store.list());
    const std::size_t before = positionOf(store.list(), stored.id);
    const std::size_t now = store.move(stored.id, wanted);
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
    options->choice.addTo(*command, true);
    options->hotspot.addTo(*command, credentialChangeFields());
    command->callback([options, &exitCode] { exitCode = runDelete(*options); });
}

void addCredentialMove(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<PlaceOptions>();
    CLI::App* command = parent.add_subcommand("move", "Give a credential another priority");
    options->choice.addTo(*command, true);
    command->add_option("POSITION", options->position, "Its place in the order of priority; 1 is the first")
        ->type_name("N");
    options->hotspot.addTo(*command, credentialChangeFields());
    command->callback([options, &exitCode] { exitCode = runMove(*options); });
}

void addCredentialCommand(CLI::App& app, int& exitCode) {
    CLI::App* command = app.add_subcommand(
        "credential", "List credentials; add, edit, delete or move one; keep them in a file");
    command->require_subcommand(1);
    addCredentialList(*command, exitCode);
    addCredentialAdd(*command, exitCode);
    addCredentialEdit(*command, exitCode);
    addCredentialDelete(*command, exitCode);
    addCredentialMove(*command, exitCode);
    addCredentialExport(*command, exitCode);
    addCredentialImport(*command, exitCode);
}

}  // namespace vexa::client
