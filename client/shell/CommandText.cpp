#include "client/shell/CommandText.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <utility>

namespace vexa::client {

namespace {

struct KindName {
    const char* value;
    ValueKind kind;
};
constexpr std::array kKinds{
    KindName{"DIR", ValueKind::Directory},    KindName{"FILE", ValueKind::File},
    KindName{"PATH", ValueKind::File},        KindName{"NAME", ValueKind::Network},
    KindName{"WHICH", ValueKind::Credential}, KindName{"CHANNEL", ValueKind::Channel}};

ValueKind kindOf(const std::string& value) {
    const auto* const known =
        std::find_if(kKinds.begin(), kKinds.end(), [&](const KindName& kind) { return kind.value == value; });
    return known == kKinds.end() ? ValueKind::Other : known->kind;
}

/// Of a type such as `TEXT:{ttls,tls}` what stands between the braces.
std::vector<std::string> choicesIn(const std::string& type) {
    const auto open = type.find('{');
    const auto close = type.find('}', open);
    if (open == std::string::npos || close == std::string::npos) return {};
    return CLI::detail::split(type.substr(open + 1, close - open - 1), ',');
}

std::vector<std::string> dashedNames(const CLI::Option& option) {
    std::vector<std::string> names;
    for (const std::string& name : option.get_snames())
        names.push_back("-" + name);
    for (const std::string& name : option.get_lnames())
        names.push_back("--" + name);
    return names;
}

OptionText optionText(const CLI::Option& option) {
    OptionText text;
    const bool isArgument = option.get_positional();
    const std::string type = option.get_type_name();
    text.names = isArgument ? std::vector{option.get_name(true)} : dashedNames(option);
    text.choices = choicesIn(type);
    if (isArgument)
        text.value = text.names.front();
    else if (option.get_items_expected_max() > 0)
        text.value = type.substr(0, type.find(':'));
    text.kind = text.choices.empty() ? kindOf(text.value) : ValueKind::Choice;
    text.description = option.get_description();
    text.variable = option.get_envname();
    text.isRequired = option.get_required();
    return text;
}

}  // namespace

CommandText describe(const CLI::App& app) {
    CommandText text;
    text.description = app.get_description();
    for (const CLI::App* parent = &app; parent->get_parent() != nullptr; parent = parent->get_parent())
        text.path = parent->get_name() + (text.path.empty() ? "" : " " + text.path);
    for (const CLI::Option* option : app.get_options()) {
        if (option->get_group().empty()) continue;
        (option->get_positional() ? text.arguments : text.options).push_back(optionText(*option));
    }
    for (const CLI::App* command : app.get_subcommands([](const CLI::App*) { return true; })) {
        if (!command->get_group().empty()) text.commands.push_back(describe(*command));
    }
    return text;
}

std::vector<const CommandText*> allCommands(const CommandText& command) {
    std::vector<const CommandText*> all{&command};
    for (const CommandText& below : command.commands) {
        const auto more = allCommands(below);
        all.insert(all.end(), more.begin(), more.end());
    }
    return all;
}

std::vector<ValuePlace> valuePlaces(const CommandText& command) {
    std::vector<ValuePlace> places;
    for (const CommandText* one : allCommands(command)) {
        for (const OptionText& option : one->options) {
            for (const std::string& name : option.names) {
                if (!option.value.empty()) places.push_back({one->path + " " + name, &option});
            }
        }
        for (std::size_t i = 0; i < one->arguments.size(); ++i)
            places.push_back({one->path + " " + std::to_string(i + 1), &one->arguments[i]});
    }
    return places;
}

}  // namespace vexa::client
