#pragma once

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace vexa::client {

/// What a word of the command line stands for, as far as a shell can complete it.
enum class ValueKind { Other, Choice, File, Directory, Network, Credential, Channel };

/// An option, or an argument that has a place instead of a name.
struct OptionText {
    /// With their dashes, the short ones first; the one name of an argument.
    std::vector<std::string> names;
    /// What stands for its value, such as N; empty for a flag.
    std::string value;
    std::string description;
    /// Of the environment, from which it is taken where it is not given; or empty.
    std::string variable;
    std::vector<std::string> choices;
    ValueKind kind = ValueKind::Other;
    bool isRequired = false;
};

/// A command in words, as the parser knows it. What the help does not show is left out.
struct CommandText {
    /// All words behind the program's name, as in `credential add`; empty for the program.
    std::string path;
    std::string description;
    std::vector<OptionText> options;
    std::vector<OptionText> arguments;
    std::vector<CommandText> commands;

    /// The last word of the path.
    std::string name() const { return path.substr(path.rfind(' ') + 1); }
};

CommandText describe(const CLI::App& app);

/// The command and all below it, each before those below it.
std::vector<const CommandText*> allCommands(const CommandText& command);

/// Where a command line has a value: behind an option, as `scan --port`, or in a place of a command's own, as
/// `connect 1`.
struct ValuePlace {
    std::string words;
    const OptionText* option;
};

/// All of the command and of those below it, as long as it lives.
std::vector<ValuePlace> valuePlaces(const CommandText& command);

}  // namespace vexa::client
