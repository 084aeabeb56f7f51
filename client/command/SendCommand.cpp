#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/port/Event.h"
#include "client/port/EventLines.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

using std::chrono::milliseconds;

constexpr int kDefaultWaitMs = 1000;
constexpr milliseconds kGoodbyeLimit{2000};

struct SendOptions {
    std::uint16_t port = 0;
    std::string command;
    std::string data;
    int waitMs = kDefaultWaitMs;
    bool json = false;
    bool showPasswords = false;
};

void printAnswers(WebSocketClient& client, Signals& signals, milliseconds wait, Passwords passwords) {
    EventLoop loop(signals);
    const Deadline deadline = Deadline::in(wait);
    while (!deadline.isOver() && loop.wait(client.polled(), deadline)) {
        client.process();
        if (!printEvents(client, passwords)) return;
        client.requireOpen();
    }
}

int runSend(const SendOptions& options, bool hasData) {
    Signals signals;
    WebSocketClient client(options.port);
    client.send(commandText(options.command, hasData ? std::optional(options.data) : std::nullopt));
    printAnswers(client, signals, milliseconds(options.waitMs),
                 options.showPasswords ? Passwords::Shown : Passwords::Hidden);
    client.close(kGoodbyeLimit);
    return kExitOk;
}

}  // namespace

void addSendCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<SendOptions>();
    CLI::App* command =
        app.add_subcommand("send", "Send a command to a port and print the events that come then");
    command->add_option("PORT", options->port, "Port of the spectral analyser or of the hotspot half")
        ->required()
        ->check(CLI::Range(1, 65535));
    command->add_option("COMMAND", options->command, "Such as GET_CHANNEL_LIST")->required();
    CLI::Option* data =
        command->add_option("DATA", options->data, "Text that goes with it, often JSON itself");
    command
        ->add_option("--wait", options->waitMs,
                     "Milliseconds to wait for events; default 1000, 0: not at all")
        ->type_name("MS")
        ->check(CLI::Range(0, 3600000));
    command->add_flag("--json", options->json, "Print JSON, as always: an event a line");
    command->add_flag("--show-passwords", options->showPasswords, "Show the passwords too");
    command->callback([options, data, &exitCode] { exitCode = runSend(*options, data->count() > 0); });
}

}  // namespace vexa::client
