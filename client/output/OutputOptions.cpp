#include "client/output/OutputOptions.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace vexa::client {

std::string namesOf(const FieldList& fields) {
    std::string names;
    for (const Field& field : fields.fields)
        names += (names.empty() ? "" : ", ") + field.name;
    return names;
}

void OutputOptions::addTo(CLI::App& command, const FieldList& fields, const char* jsonDescription) {
    known = fields;
    CLI::Option* const asJson = command.add_flag("--json", json, jsonDescription);
    if (known.fields.empty()) return;
    const auto isKnown = [this](const std::string& name) {
        const bool found = std::any_of(known.fields.begin(), known.fields.end(),
                                       [&](const Field& field) { return field.name == name; });
        return found ? "" : "no field " + name + ", there is " + namesOf(known);
    };
    command.add_option("--fields", chosen, "These fields alone, in this order: " + namesOf(known))
        ->type_name("A,B")
        ->delimiter(',')
        ->allow_extra_args(false)
        ->check(isKnown);
    command
        .add_flag("--terse", terse,
                  "A line for each thing: its fields with a colon between them, `:` and `\\` behind a `\\`")
        ->excludes(asJson);
}

}  // namespace vexa::client
