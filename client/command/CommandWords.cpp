#include "client/command/CommandWords.h"

#include <CLI/CLI.hpp>
#include <algorithm>

#include "client/terminal/ClientError.h"
#include "client/terminal/Nearest.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using Commands = std::vector<const CLI::App*>;

/// A command without a group is not told of.
std::vector<std::string> shownNames(const Commands& commands) {
    std::vector<std::string> names;
    for (const CLI::App* command : commands) {
        if (!command->get_group().empty()) names.push_back(command->get_name());
    }
    return names;
}

[[noreturn]] void refuse(const std::string& path, const std::string& word, const Commands& commands) {
    std::string line = "there is no command " + inQuotes(path + word);
    const auto meant = likelyMeant(shownNames(commands), word);
    for (std::size_t i = 0; i < meant.size(); ++i)
        line += (i == 0                  ? ": did you mean "
                 : i + 1 == meant.size() ? " or "
                                         : ", ") +
                inQuotes(path + meant[i]);
    throw CLI::ParseError(line + (meant.empty() ? "" : "?"), kExitWrongUse);
}

}  // namespace

std::vector<std::string> commandWords(const CLI::App& app, std::vector<std::string> words) {
    if (!words.empty() && words.front() == "help") {
        words.erase(words.begin());
        words.emplace_back("--help");
    }
    std::string path;
    Commands commands = app.get_subcommands(nullptr);
    for (const std::string& word : words) {
        if (commands.empty() || word.starts_with('-')) break;
        const auto found = std::find_if(commands.begin(), commands.end(),
                                        [&](const CLI::App* command) { return command->check_name(word); });
        if (found == commands.end()) refuse(path, word, commands);
        path += word + ' ';
        commands = (*found)->get_subcommands(nullptr);
    }
    return words;
}

}  // namespace vexa::client
