#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <iostream>
#include <sstream>
#include <string>
#include <utility>

#include "client/command/CommandWords.h"
#include "client/command/Commands.h"
#include "client/command/HelpText.h"
#include "client/command/Program.h"
#include "client/output/Silence.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/LineFit.h"
#include "client/terminal/Terminal.h"
#include "contract/Version.h"

namespace {

using namespace vexa::client;

constexpr std::array kCommands{
    &addStartCommand,      &addHostCommands,    &addStatusCommand,   &addScanCommand,
    &addChannelsCommand,   &addNetworksCommand, &addConnectCommand,  &addDisconnectCommand,
    &addEnableCommand,     &addDisableCommand,  &addRefreshCommand,  &addCredentialsCommand,
    &addCredentialCommand, &addReloadCommand,   &addWatchCommand,    &addLogCommand,
    &addDoctorCommand,     &addSendCommand,     &addListenCommand,   &addRecordCommand,
    &addStatsCommand,      &addReplayCommand,   &addScenarioCommand, &addPanelCommand,
    &addShellCommands};

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

/// Parents end as their service does, whoever has asked for it.
bool isParent(const CLI::App& app) {
    const auto& chosen = app.get_subcommands();
    return !chosen.empty() && (chosen.front()->get_name() == "start" || chosen.front()->get_name() == "demo");
}

int run(int argc, char** argv, Silence& silence) {
    CLI::App app("The Vexa wireless service: start it, look at the air, keep its credentials.", "vexa");
    app.set_version_flag("--version", std::string("vexa ") + vexa::contract::version());
    addJsonVersion(app);
    // What begins with a slash is a name or a path, on every system.
    app.allow_windows_style_options(false);
    app.add_subcommand("help", "Tell how to use a command");
    app.require_subcommand(1);
    int exitCode = kExitOk;
    for (const auto add : kCommands)
        add(app, exitCode);
    silence.addTo(app);
    try {
        auto words = commandWords(app, {argv + 1, argv + argc});
        std::reverse(words.begin(), words.end());  // so the parser takes them
        app.parse(std::move(words));
    } catch (const CLI::Success& help) {
        std::ostringstream text;
        const int code = app.exit(help, text);
        std::cout << helpText(text.str(), lineRoom());
        return code;
    } catch (const ClientError& error) {
        exitCode = report(error, error.exitCode());
    }
    return EventLoop::stopCode() == 0 || isParent(app) ? exitCode : EventLoop::stopCode();
}

int runAndReport(int argc, char** argv, Silence& silence) {
    try {
        return run(argc, argv, silence);
    } catch (const CLI::ParseError& error) {
        return reportWrongUse(error);
    } catch (const std::exception& error) {
        return report(error, kExitFailed);
    }
}

}  // namespace

// A reader who has gone wants no more; elsewhere, what could not be printed was not done.
int vexa::client::runProgram(int argc, char** argv) {
    Silence silence;
    const int exitCode = runAndReport(argc, argv, silence);
    std::cout << std::flush;
    if (exitCode != kExitOk || std::cout || isOutputPipe()) return exitCode;
    return report(ClientError("standard output cannot be written"), kExitFailed);
}
