#include <CLI/CLI.hpp>
#include <array>
#include <iostream>

#include "client/ClientError.h"
#include "client/Commands.h"

namespace {

using namespace vexa::client;

constexpr std::array kCommands{&addStartCommand,    &addDemoCommand, &addScanCommand,
                               &addChannelsCommand, &addSendCommand, &addListenCommand};

int wrongUse(const CLI::ParseError& error) {
    std::cerr << "vexa: " << error.what() << "\nvexa: --help tells how to use it\n";
    return kExitWrongUse;
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app("The Vexa wireless service: start it, look at the spectrum, talk to its ports.", "vexa");
    app.require_subcommand(1);
    int exitCode = kExitOk;
    for (const auto add : kCommands)
        add(app, exitCode);
    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& help) {
        return app.exit(help);
    } catch (const CLI::ParseError& error) {
        return wrongUse(error);
    } catch (const ClientError& error) {
        std::cerr << "vexa: " << error.what() << '\n';
        return error.exitCode();
    } catch (const std::exception& error) {
        std::cerr << "vexa: " << error.what() << '\n';
        return kExitFailed;
    }
    return exitCode;
}
