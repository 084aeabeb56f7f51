#pragma once

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace vexa::client {

/// A member of what a command tells.
struct Field {
    /// As in JSON; `credential.id` is the member `id` of the member `credential`.
    std::string name;
    std::string heading;
};

/// What a command tells of each thing that it lists, or of the one that there is, in the order of a terse
/// line.
struct FieldList {
    std::vector<Field> fields;
    /// The member of the JSON object that holds the things; empty if the value holds them itself.
    std::string listedIn = {};
};

/// How the user wants to be told: in words, as JSON, or as a line of fields for each thing.
struct OutputOptions {
    bool json = false;
    bool terse = false;
    /// Those that were chosen, in their order; none: all.
    std::vector<std::string> chosen;
    FieldList known;

    /// Adds the option for JSON, and those for fields if there are any. To be called once, on options that
    /// stay where they are.
    void addTo(CLI::App& command, const FieldList& fields, const char* jsonDescription = "Print JSON");
};

/// With commas between them.
std::string namesOf(const FieldList& fields);

}  // namespace vexa::client
