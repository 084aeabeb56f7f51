#include <CLI/CLI.hpp>
#include <fstream>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/port/JsonLine.h"
#include "client/record/AirScenario.h"
#include "client/record/RecordingFile.h"
#include "client/record/RecordingReader.h"
#include "client/record/SpectrumScenario.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

struct ScenarioOptions {
    std::string file;
    std::string output = kStandardStream;
    bool json = false;
};

struct Made {
    Json::Value scenario{Json::objectValue};
    ScenarioNotes notes;
};

Made scenarioOf(const std::string& file) {
    RecordingReader reader(file);
    AirHistory air;
    SpectrumScenario spectrum;
    while (const auto recorded = reader.next()) {
        air.take(*recorded);
        spectrum.take(*recorded);
    }
    Made made;
    ScenarioTimeline timeline;
    AirScenario(air).write(made.scenario, timeline, made.notes);
    spectrum.write(made.scenario, timeline, made.notes);
    made.scenario["timeline"] = timeline.actions();
    return made;
}

/// A member a line, and of arrays an element: it is to be changed by hand.
std::string scenarioText(const Json::Value& scenario) {
    std::string text = "{";
    for (const std::string& name : scenario.getMemberNames()) {
        const Json::Value& value = scenario[name];
        text += (text.size() == 1 ? "\n    " : ",\n    ") + jsonLine(name) + ": ";
        if (!value.isArray() || value.empty()) {
            text += jsonLine(value);
            continue;
        }
        const char* before = "[\n        ";
        for (const Json::Value& element : value) {
            text += before + jsonLine(element);
            before = ",\n        ";
        }
        text += "\n    ]";
    }
    return text + "\n}\n";
}

int printJson(const Made& made) {
    Json::Value object(Json::objectValue);
    object["scenario"] = made.scenario;
    object["notes"] = Json::arrayValue;
    for (const std::string& note : made.notes)
        object["notes"].append(note);
    std::cout << jsonLine(object) << std::endl;
    return kExitOk;
}

int runFrom(const ScenarioOptions& options) {
    const Made made = scenarioOf(options.file);
    if (options.json) return printJson(made);
    const std::string text = scenarioText(made.scenario);
    if (options.output == kStandardStream) {
        std::cout << text << std::flush;
    } else {
        std::ofstream file = createFile(options.output);
        if (!(file << text << std::flush)) failWriting(options.output);
    }
    for (const std::string& note : made.notes)
        std::cerr << "vexa: " << note << '\n';
    return kExitOk;
}

}  // namespace

void addScenarioCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ScenarioOptions>();
    CLI::App* scenario = app.add_subcommand("scenario", "Make a scenario of a simulated machine");
    scenario->require_subcommand(1);
    CLI::App* command = scenario->add_subcommand(
        "from", "Make one of a recording; on standard error, what in it is approximated or unknown");
    command->add_option("FILE", options->file, "The recording; -: standard input")->required();
    CLI::Option* output =
        command->add_option("-o,--output", options->output, "A new file; default: standard output");
    output->type_name("FILE");
    command->add_flag("--json", options->json, "Print one JSON object: the scenario, and the notes on it")
        ->excludes(output);
    command->callback([options, &exitCode] { exitCode = runFrom(*options); });
}

}  // namespace vexa::client
