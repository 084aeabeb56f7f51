#include <CLI/CLI.hpp>
#include <cstdlib>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/shell/CommandText.h"
#include "client/shell/Completion.h"
#include "client/shell/ManPage.h"
#include "client/shell/ServiceNames.h"
#include "client/shell/ShellFiles.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

// What the parser is asked when a command has been selected: it knows all commands then.

void printManPage(const CLI::App& app, const std::vector<std::string>& words) {
    const CommandText program = describe(app);
    const std::string path = joined(words, " ");
    for (const CommandText* command : allCommands(program)) {
        if (command->path != path) continue;
        std::cout << manPage(program, *command) << std::flush;
        return;
    }
    throw ClientError("there is no command " + inQuotes(path), kExitWrongUse);
}

/// Nothing is cleaned up behind a question that is still open.
void printNames(const std::string& kind, const std::vector<std::string>& words) {
    for (const std::string& name : serviceNames(kind, words))
        std::cout << name << '\n';
    std::cout << std::flush;
    std::_Exit(kExitOk);
}

void addNamesCommand(CLI::App& app) {
    auto kind = std::make_shared<std::string>();
    CLI::App* command = app.add_subcommand("__complete", "Names for the completion of a line")->group("");
    command->add_option("KIND", *kind)
        ->required()
        ->check(CLI::IsMember({"networks", "credentials", "channels"}));
    command->prefix_command();
    command->callback([command, kind] { printNames(*kind, command->remaining()); });
}

void addFilesCommand(CLI::App& app) {
    auto folder = std::make_shared<std::string>();
    CLI::App* command =
        app.add_subcommand("__shell-files", "Write what a package holds for shells")->group("");
    command->add_option("DIR", *folder)->required();
    command->callback([&app, folder] { writeShellFiles(*folder, describe(app)); });
}

}  // namespace

void addShellCommands(CLI::App& app, int& /*exitCode*/) {
    auto shell = std::make_shared<std::string>();
    CLI::App* completion =
        app.add_subcommand("completion", "Print the script that makes a shell complete command lines");
    completion->add_option("SHELL", *shell, "Which shell")
        ->required()
        ->check(CLI::IsMember({"bash", "zsh", "fish", "powershell"}));
    completion->callback([&app, shell] { std::cout << completionFor(*shell, describe(app)) << std::flush; });
    auto words = std::make_shared<std::vector<std::string>>();
    CLI::App* manual = app.add_subcommand("man", "Print the manual page of the program or of a command");
    manual->add_option("COMMAND", *words, "The command, as in `credential add`; default: the program");
    manual->callback([&app, words] { printManPage(app, *words); });
    addNamesCommand(app);
    addFilesCommand(app);
}

}  // namespace vexa::client
