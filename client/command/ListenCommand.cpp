#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/PortOption.h"
#include "client/port/EventLines.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

struct ListenOptions {
    PortArgument port;
    bool json = false;
    bool showPasswords = false;
};

int runListen(const ListenOptions& options) {
    Signals signals;
    WebSocketClient client(options.port.find());
    EventLoop loop(signals);
    while (loop.wait(client.polled(), Deadline::never())) {
        client.process();
        if (!printEvents(client, options.showPasswords ? Passwords::Shown : Passwords::Hidden)) break;
        client.requireOpen();
    }
    return kExitOk;
}

}  // namespace

void addListenCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ListenOptions>();
    CLI::App* command = app.add_subcommand("listen", "Print the events of a port as they come, until Ctrl-C");
    options->port.addTo(*command);
    command->add_flag("--json", options->json, "Print JSON, as always: an event a line");
    command->add_flag("--show-passwords", options->showPasswords, "Show the passwords too");
    command->callback([options, &exitCode] { exitCode = runListen(*options); });
}

}  // namespace vexa::client
