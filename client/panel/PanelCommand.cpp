#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/panel/PanelServing.h"

namespace vexa::client {

namespace {

int runPanel(PanelOptions& options) {
    Signals signals;
    return options.demo ? demoPanel()(options, signals) : servePanel(options, signals);
}

}  // namespace

void addPanelCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<PanelOptions>();
    CLI::App* command = app.add_subcommand(
        "panel",
        "Show spectrum, networks and credentials in the browser, until its page is closed or Ctrl-C");
    PortOption::addBothTo(*command, options->spectral, options->hotspot);
    command->add_option("--port", options->port, "Serve the page on this port; default: a free one")
        ->type_name("N")
        ->check(CLI::Range(1, 65535));
    command->add_flag("--no-open", options->noOpen,
                      "Open no browser; the address that is printed lets in once");
    command
        ->add_option("--recordings", options->recordings, "Folder for recordings; default: the present one")
        ->type_name("DIR");
    command
        ->add_option("--linger", options->linger,
                     "Go on for so long after the last page was closed; default 30")
        ->type_name("SECONDS")
        ->check(CLI::Range(0, 86400));
    if (demoPanel() != nullptr) command->add_flag("--demo", options->demo, "Show the machine of `vexa demo`");
    command->add_flag("--json", options->json, "Print JSON: the address");
    command->callback([options, &exitCode] { exitCode = runPanel(*options); });
}

}  // namespace vexa::client
