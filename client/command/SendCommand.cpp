#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/PortOption.h"
#include "client/port/Event.h"
#include "client/port/EventLines.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/InputLine.h"
#include "text/Utf8.h"

namespace vexa::client {

namespace {

using std::chrono::milliseconds;

constexpr int kDefaultWaitMs = 1000;
constexpr milliseconds kGoodbyeLimit{2000};

struct SendOptions {
    PortArgument port;
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

/// A lone dash stands for what comes on standard input.
std::string dataOf(const SendOptions& options, Signals& signals) {
    if (options.data != "-") return options.data;
    EventLoop loop(signals);
    std::string data = readToEnd(loop);
    if (!isValidUtf8(data)) throw ClientError("what came on standard input is no UTF-8 text");
    return data;
}

int runSend(const SendOptions& options, bool hasData) {
    Signals signals;
    WebSocketClient client(options.port.find());
    client.send(
        commandText(options.command, hasData ? std::optional(dataOf(options, signals)) : std::nullopt));
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
    options->port.addTo(*command);
    command->add_option("COMMAND", options->command, "Such as GET_CHANNEL_LIST")->required();
    CLI::Option* data = command->add_option(
        "DATA", options->data, "Text that goes with it, often JSON itself; `-` reads it from standard input");
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
