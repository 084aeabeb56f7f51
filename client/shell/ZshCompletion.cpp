#include <sstream>

#include "client/shell/Completion.h"

namespace vexa::client {

namespace {

constexpr const char* kZshHead = R"zsh(#compdef vexa
# Completes the command line of vexa in zsh, made by `vexa completion zsh`.

# Names of the kind $1, from the service that the line means.
_vexa_names() {
    local -a names
    names=(${(f)"$("${(Q)vexa_line[1]}" __complete $1 "${(@Q)vexa_line[2,-2]}" 2>/dev/null)"})
    compadd -a names
}
)zsh";

constexpr const char* kZshTail = R"zsh(
_vexa() {
    local -a vexa_line
    vexa_line=("${(@)words[1,CURRENT]}")
    _vexa_at_
}

if [ "$funcstack[1]" = _vexa ]; then
    _vexa "$@"
else
    compdef _vexa vexa
fi
)zsh";

/// In single quotes.
std::string zshQuoted(const std::string& text) {
    return "'" + escapedText(text, "'", "'\\'") + "'";
}

std::string functionName(const CommandText& command) {
    std::string name = "_vexa_at_" + command.path;
    for (char& character : name) {
        if (character == ' ') character = '_';
    }
    return name;
}

/// What stands behind a colon and says how to complete a value.
std::string action(const OptionText& option) {
    if (option.kind == ValueKind::Choice) return "(" + joined(option.choices, " ") + ")";
    if (option.kind == ValueKind::Directory) return "_files -/";
    if (option.kind == ValueKind::File) return "_files";
    const std::string names = askedNames(option.kind);
    return names.empty() ? " "
                         : " _vexa_names " + names;  // without the blank it gets options before the kind
}

void appendZshOption(std::ostream& out, const OptionText& option) {
    const std::string exclusion = option.names.size() > 1 ? "(" + joined(option.names, " ") + ")" : "";
    const std::string value = option.value.empty() ? "" : ":" + option.value + ":" + action(option);
    const std::string description = "[" + escapedText(option.description, "[]:\\") + "]";
    for (const std::string& name : option.names) {
        std::string entry = exclusion + name;
        if (!option.value.empty() && name.starts_with("--")) entry += '=';
        entry += description;
        entry += value;
        out << " \\\n        " << zshQuoted(entry);
    }
}

void appendFunction(std::ostream& out, const CommandText& command) {
    out << '\n' << functionName(command) << "() {\n";
    const bool hasCommands = !command.commands.empty();
    if (hasCommands) out << "    local curcontext=$curcontext state line\n    local -A opt_args\n";
    out << "    _arguments " << (hasCommands ? "-C " : "") << "-s";
    for (const OptionText& option : command.options)
        appendZshOption(out, option);
    for (std::size_t i = 0; i < command.arguments.size(); ++i) {
        const OptionText& argument = command.arguments[i];
        out << " \\\n        "
            << zshQuoted(std::to_string(i + 1) + (argument.isRequired ? ":" : "::") + argument.value + ":" +
                         action(argument));
    }
    if (!hasCommands) {
        out << "\n}\n";
        return;
    }
    out << " \\\n        '1: :->commands' \\\n        '*:: :->rest'\n    local -a commands=(\n";
    for (const CommandText& below : command.commands)
        out << "        " << zshQuoted(below.name() + ":" + escapedText(below.description, ":\\")) << '\n';
    out << "    )\n    case $state in\n        commands) _describe command commands ;;\n"
           "        rest)\n            case $words[1] in\n";
    for (const CommandText& below : command.commands)
        out << "                " << below.name() << ") " << functionName(below) << " ;;\n";
    out << "            esac ;;\n    esac\n}\n";
}

}  // namespace

std::string zshCompletion(const CommandText& program) {
    std::ostringstream out;
    out << kZshHead;
    for (const CommandText* command : allCommands(program))
        appendFunction(out, *command);
    out << kZshTail;
    return out.str();
}

}  // namespace vexa::client
