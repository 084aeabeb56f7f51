#include "client/shell/ManPage.h"

#include <algorithm>
#include <array>
#include <sstream>

#include "client/shell/Completion.h"
#include "contract/Version.h"

namespace vexa::client {

namespace {

/// Goes with the version.
constexpr const char* kDate = "2026-11-25";

constexpr const char* kEnd =
    ".SH EXIT STATUS\n"
    ".TP\n.B 0\nIt is done.\n"
    ".TP\n.B 1\nIt failed; a line on standard error says why.\n"
    ".TP\n.B 2\nThe command line is wrong.\n"
    ".TP\n.B 3\nThe service could not be started.\n";

/// What troff would take for something else.
struct Special {
    char character;
    const char* written;
};
constexpr std::array kSpecials{Special{'\\', "\\(rs"}, Special{'-', "\\-"},   Special{'`', "\\(ga"},
                               Special{'\'', "\\(aq"}, Special{'^', "\\(ha"}, Special{'~', "\\(ti"}};

/// Text as troff takes it, whatever it holds.
std::string roff(const std::string& text) {
    std::string out;
    for (const char character : text) {
        const auto* const special =
            std::find_if(kSpecials.begin(), kSpecials.end(),
                         [character](const Special& one) { return one.character == character; });
        out += special == kSpecials.end() ? std::string(1, character) : special->written;
    }
    return out.starts_with('.') ? "\\&" + out : out;
}

/// In italics, in a line of its own font.
std::string italic(const std::string& text) {
    return "\\fI" + roff(text) + "\\fR";
}

std::string bold(const std::string& text) {
    return "\\fB" + roff(text) + "\\fR";
}

std::string asSentence(std::string text) {
    if (!text.empty() && !text.ends_with('.')) text += '.';
    return text;
}

std::string valueOf(const OptionText& option) {
    return option.choices.empty() ? option.value : joined(option.choices, "|");
}

void appendSynopsis(std::ostream& out, const CommandText& command) {
    out << ".SH SYNOPSIS\n" << bold("vexa" + (command.path.empty() ? "" : " " + command.path));
    if (!command.options.empty()) out << " [" << italic("OPTION") << "]...";
    for (const OptionText& argument : command.arguments)
        out << ' ' << (argument.isRequired ? "" : "[") << italic(argument.value)
            << (argument.isRequired ? "" : "]");
    if (!command.commands.empty()) out << ' ' << italic("COMMAND");
    out << '\n';
}

void appendOption(std::ostream& out, const OptionText& option) {
    out << ".TP\n";
    for (std::size_t i = 0; i < option.names.size(); ++i)
        out << (i == 0 ? "" : ", ") << bold(option.names[i]);
    if (!option.value.empty() && option.value != option.names.front()) out << ' ' << italic(valueOf(option));
    out << '\n' << roff(asSentence(option.description)) << '\n';
    if (!option.variable.empty())
        out << "Where it is not given, the variable " << bold(option.variable)
            << " of the environment counts.\n";
}

void appendOptions(std::ostream& out, const std::string& heading, const std::vector<OptionText>& options) {
    if (options.empty()) return;
    out << ".SH " << heading << '\n';
    for (const OptionText& option : options)
        appendOption(out, option);
}

void appendCommands(std::ostream& out, const CommandText& command) {
    if (command.commands.empty()) return;
    out << ".SH COMMANDS\n";
    for (const CommandText& below : command.commands)
        out << ".TP\n" << bold(below.path) << '\n' << roff(asSentence(below.description)) << '\n';
}

/// The pages above and below, with commas between them.
void appendSeeAlso(std::ostream& out, const CommandText& program, const CommandText& command) {
    std::vector<std::string> names;
    if (&command != &program) names.push_back(manPageName(program));
    for (const CommandText& below : command.commands)
        names.push_back(manPageName(below));
    out << ".SH SEE ALSO\n";
    for (std::size_t i = 0; i < names.size(); ++i)
        out << ".BR " << roff(names[i]) << " (1)" << (i + 1 < names.size() ? "," : "") << '\n';
}

}  // namespace

std::string manPageName(const CommandText& command) {
    std::string name = "vexa" + (command.path.empty() ? "" : "-" + command.path);
    std::replace(name.begin(), name.end(), ' ', '-');
    return name;
}

std::string manPage(const CommandText& program, const CommandText& command) {
    const std::string name = manPageName(command);
    std::string title = name;
    std::transform(title.begin(), title.end(), title.begin(), [](char character) {
        return character >= 'a' && character <= 'z' ? character - 32 : character;
    });
    std::ostringstream out;
    out << ".TH " << roff(title) << " 1 " << kDate << " \"vexa " << contract::version() << "\" \"Vexa\"\n"
        << ".SH NAME\n"
        << roff(name) << " \\- " << roff(command.description) << '\n';
    appendSynopsis(out, command);
    out << ".SH DESCRIPTION\n" << roff(asSentence(command.description)) << '\n';
    appendCommands(out, command);
    appendOptions(out, "ARGUMENTS", command.arguments);
    appendOptions(out, "OPTIONS", command.options);
    out << kEnd;
    appendSeeAlso(out, program, command);
    return out.str();
}

}  // namespace vexa::client
