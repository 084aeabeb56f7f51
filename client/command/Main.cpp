#include <CLI/CLI.hpp>
#include <array>
#include <iostream>
#include <string>

#include "client/command/Commands.h"
#include "client/command/Program.h"
#include "client/output/Silence.h"
#include "client/terminal/ClientError.h"
#include "contract/Version.h"

namespace {

using namespace vexa::client;

constexpr std::array kCommands{
    &addStartCommand,      &addHostCommands,    &addStatusCommand,  &addScanCommand,
    &addChannelsCommand,   &addNetworksCommand, &addConnectCommand, &addDisconnectCommand,
    &addEnableCommand,     &addDisableCommand,  &addRefreshCommand, &addCredentialsCommand,
    &addCredentialCommand, &addReloadCommand,   &addWatchCommand,   &addLogCommand,
    &addSendCommand,       &addListenCommand,   &addShellCommands};

int report(const std::exception& error, int exitCode) {
    std::cerr << "vexa: " << error.what() << '\n';
    return exitCode;
}

int reportWrongUse(const CLI::ParseError& error) {
    report(error, kExitWrongUse);
    std::cerr << "vexa: --help tells how to use it\n";
    return kExitWrongUse;
}

// Rises when a member that is there today goes, or means something else; new members don't count.
constexpr const char* kJsonVersion = "1";

void addJsonVersion(CLI::App& app) {
    app.add_flag_callback(
        "--json-version", [] { throw CLI::CallForVersion(kJsonVersion, 0); },
        "Display the version of the JSON that the commands print and exit");
}

int run(int argc, char** argv, Silence& silence) {
    CLI::App app("The Vexa wireless service: start it, look at the air, keep its credentials.", "vexa");
    app.set_version_flag("--version", std::string("vexa ") + vexa::contract::version());
    addJsonVersion(app);
    app.require_subcommand(1);
    int exitCode = kExitOk;
    for (const auto add : kCommands)
        add(app, exitCode);
    silence.addTo(app);
    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& help) {
        return app.exit(help);
    }
    return exitCode;
}

}  // namespace

int vexa::client::runProgram(int argc, char** argv) {
    Silence silence;
    try {
        return run(argc, argv, silence);
    } catch (const CLI::ParseError& error) {
        return reportWrongUse(error);
    } catch (const ClientError& error) {
        return report(error, error.exitCode());
    } catch (const std::exception& error) {
        return report(error, kExitFailed);
    }
}
