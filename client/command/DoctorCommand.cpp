#include <CLI/CLI.hpp>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/doctor/Diagnosis.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/LineFit.h"

namespace vexa::client {

namespace {

constexpr std::size_t kSeenColumn = 16;  // behind the state and the name of the longest gate

/// Also of a service that has left no port.
Observations observed(const HotspotOptions& options) {
    Signals signals;
    std::uint16_t port = 0;
    try {
        port = options.port.find();
    } catch (const ClientError& error) {
        Observations seen;
        seen.serviceTrouble = error.what();
        seen.whyNoLog = "the service was not asked";
        seen.isHotspotOn = hotspotSwitch(options.port.machine());
        return seen;
    }
    return observe(port, signals, options.limit(), options.port.machine());
}

/// As the terminal shows them: what is seen and advised stays in its column.
std::vector<std::string> shown(const std::vector<std::string>& lines) {
    const auto columns = lineRoom();
    if (!columns) return lines;
    std::vector<std::string> rows;
    for (const std::string& line : lines) {
        for (std::string& row : wrapped(line, *columns, kSeenColumn))
            rows.push_back(std::move(row));
    }
    return rows;
}

int runDoctor(const HotspotOptions& options) {
    const auto findings = diagnose(observed(options));
    auto lines = shown(diagnosisLines(findings));
    const std::string names = namesInTheWay(findings);
    if (names.empty())
        lines.emplace_back(isAllKnown(findings) ? "Nothing is in the way of a connection."
                                                : "Nothing that is known is in the way of a connection.");
    print(options, diagnosisJson(findings), lines);
    if (!names.empty()) throw ClientError("in the way of a connection: " + names);
    return kExitOk;
}

}  // namespace

void addDoctorCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<HotspotOptions>();
    CLI::App* command = app.add_subcommand(
        "doctor", "Tell what stands between you and a connection, and what to do about it");
    options->addTo(*command,
                   {{{"state", "State"}, {"gate", "Gate"}, {"seen", "Seen"}, {"advice", "Advice"}}, "gates"});
    command->callback([options, &exitCode] { exitCode = runDoctor(*options); });
}

}  // namespace vexa::client
