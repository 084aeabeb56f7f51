#include <sstream>

#include "client/shell/Completion.h"

namespace vexa::client {

namespace {

constexpr const char* kFishFunctions = R"fish(
# Succeeds where the words before the cursor name the command $argv[1]; with $argv[2] only in this place of its
# arguments.
function __vexa_at
    set -l words (commandline -opc)
    set -e words[1]
    set -l path ''
    set -l place 1
    set -l skipped ''
    for word in $words
        set -l next (string trim -- "$path $word")
        if test -n "$skipped"
            set skipped ''
        else if contains -- "$path $word" $__vexa_valued
            set skipped $word
        else if string match -q -- '-*' $word
        else if contains -- $next $__vexa_commands
            set path $next
        else
            set place (math $place + 1)
        end
    end
    test "$path" = "$argv[1]"; and test -z "$argv[2]" -o "$place" = "$argv[2]"
end

# Names of the kind $argv[1], from the service that the line means.
function __vexa_names
    set -l words (commandline -opc)
    $words[1] __complete $argv[1] $words[2..-1] 2>/dev/null
end

complete -c vexa -f
)fish";

std::string fishQuoted(const std::string& text) {
    return "'" + escapedText(text, "'\\") + "'";
}

/// What is offered as a value.
std::string offered(const OptionText& option) {
    if (option.kind == ValueKind::Choice) return " -a " + fishQuoted(joined(option.choices, " "));
    if (option.kind == ValueKind::Directory) return " -a '(__fish_complete_directories)'";
    if (option.kind == ValueKind::File) return " -F";
    const std::string names = askedNames(option.kind);
    return names.empty() ? "" : " -a '(__vexa_names " + names + ")'";
}

void appendCommand(std::ostream& out, const CommandText& command) {
    const std::string begin = "complete -c vexa -n ";
    const std::string here = "__vexa_at \"" + command.path + "\"";
    for (const CommandText& below : command.commands)
        out << begin << fishQuoted(here + " 1") << " -a " << below.name() << " -d "
            << fishQuoted(below.description) << '\n';
    for (const OptionText& option : command.options) {
        out << begin << fishQuoted(here);
        for (const std::string& name : option.names)
            out << (name.starts_with("--") ? " -l " + name.substr(2) : " -s " + name.substr(1));
        out << (option.value.empty()             ? ""
                : option.kind == ValueKind::File ? " -r"
                                                 : " -x")
            << offered(option) << " -d " << fishQuoted(option.description) << '\n';
    }
    for (std::size_t i = 0; i < command.arguments.size(); ++i) {
        const OptionText& argument = command.arguments[i];
        if (!offered(argument).empty())
            out << begin << fishQuoted(here + " " + std::to_string(i + 1)) << offered(argument) << " -d "
                << fishQuoted(argument.description) << '\n';
    }
}

}  // namespace

std::string fishCompletion(const CommandText& program) {
    std::ostringstream out;
    out << "# Completes the command line of vexa in fish, made by `vexa completion fish`.\n\n"
           "set -g __vexa_commands";
    for (const CommandText* command : allCommands(program))
        out << (command->path.empty() ? "" : " " + fishQuoted(command->path));
    out << "\nset -g __vexa_valued";
    for (const CommandText* command : allCommands(program)) {
        for (const OptionText& option : command->options) {
            for (const std::string& name : option.names)
                out << (option.value.empty() ? "" : " " + fishQuoted(command->path + " " + name));
        }
    }
    out << '\n' << kFishFunctions;
    for (const CommandText* command : allCommands(program))
        appendCommand(out, *command);
    return out.str();
}

}  // namespace vexa::client
