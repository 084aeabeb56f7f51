#include <CLI/CLI.hpp>
#include <array>
#include <cmath>
#include <iomanip>
#include <memory>
#include <sstream>

#include "client/command/Commands.h"
#include "client/command/Output.h"
#include "client/record/RecordingReader.h"
#include "client/record/SpectrumStatistics.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using Channel = SpectrumStatistics::Channel;

struct StatsOptions {
    std::string file;
    int above = 50;
    bool json = false;
    bool csv = false;
};

struct Quantity {
    const char* name;
    LevelTimes Channel::*times;
};
constexpr std::array kQuantities{Quantity{"congestion", &Channel::congestion},
                                 Quantity{"interference", &Channel::interference}};

/// What is told of one quantity of a channel, by name; shares are in percent.
struct Figure {
    const char* name;
    double value;
};

double rounded(double value) {
    return std::round(value * 10) / 10;
}

std::array<Figure, 7> figuresOf(const LevelTimes& times, int above) {
    constexpr double kMilliseconds = 1000;
    constexpr double kPercent = 100;
    return {Figure{"seconds", rounded(static_cast<double>(times.total().count()) / kMilliseconds)},
            Figure{"min", static_cast<double>(times.least())},
            Figure{"mean", rounded(times.mean())},
            Figure{"p50", static_cast<double>(times.percentile(0.5))},
            Figure{"p95", static_cast<double>(times.percentile(0.95))},
            Figure{"max", static_cast<double>(times.greatest())},
            Figure{"above", rounded(kPercent * times.shareAbove(above))}};
}

std::string numberText(double value) {
    std::ostringstream text;
    text << std::setprecision(12) << value;
    return text.str();
}

std::vector<std::vector<std::string>> rowsOf(const std::map<int, Channel>& channels, int above) {
    std::vector<std::vector<std::string>> rows{{"channel", "quantity"}};
    for (const Figure& figure : figuresOf({}, above))
        rows.front().emplace_back(figure.name);
    for (const auto& [number, channel] : channels) {
        for (const Quantity& quantity : kQuantities) {
            std::vector<std::string> row{std::to_string(number), quantity.name};
            for (const Figure& figure : figuresOf(channel.*quantity.times, above))
                row.push_back(numberText(figure.value));
            rows.push_back(std::move(row));
        }
    }
    return rows;
}

std::vector<std::string> csvLines(const std::vector<std::vector<std::string>>& rows) {
    std::vector<std::string> lines;
    for (const auto& row : rows) {
        std::string line;
        for (const std::string& cell : row)
            line += (line.empty() ? "" : ",") + cell;
        lines.push_back(std::move(line));
    }
    return lines;
}

/// The same rows as words; the last column names the limit.
std::vector<std::string> table(std::vector<std::vector<std::string>> rows, int above) {
    rows.front() = {"Channel", "Quantity", "Seconds", "Min", "Mean", "P50", "P95", "Max"};
    rows.front().push_back("Above " + std::to_string(above));
    for (std::size_t i = 1; i < rows.size(); ++i)
        rows[i].back() += " %";
    return alignedLines(rows);
}

Json::Value jsonOf(const std::map<int, Channel>& channels, int above) {
    Json::Value object(Json::objectValue);
    object["limit"] = above;
    object["channels"] = Json::arrayValue;
    for (const auto& [number, channel] : channels) {
        Json::Value entry(Json::objectValue);
        entry["channel"] = number;
        for (const Quantity& quantity : kQuantities) {
            for (const Figure& figure : figuresOf(channel.*quantity.times, above))
                entry[quantity.name][figure.name] = figure.value;
        }
        object["channels"].append(entry);
    }
    return object;
}

int runStats(const StatsOptions& options) {
    RecordingReader reader(options.file);
    SpectrumStatistics statistics;
    while (const auto recorded = reader.next())
        statistics.take(*recorded);
    const auto channels = statistics.finish(reader.duration());
    if (channels.empty())
        throw ClientError(recordingName(options.file) +
                          " tells no value of any channel: was a scan running?");
    const auto rows = rowsOf(channels, options.above);
    print(options.json, options.json ? jsonOf(channels, options.above) : Json::Value(),
          options.csv ? csvLines(rows) : table(rows, options.above));
    return kExitOk;
}

}  // namespace

void addStatsCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<StatsOptions>();
    CLI::App* command =
        app.add_subcommand("stats", "Tell what a recording says of congestion and interference per channel");
    command->add_option("FILE", options->file, "The recording; -: standard input")->required();
    command
        ->add_option("--above", options->above, "Tell for how much of the time a value was above; default 50")
        ->type_name("LIMIT")
        ->check(CLI::Range(0, 100));
    CLI::Option* json = command->add_flag("--json", options->json, "Print JSON");
    command->add_flag("--csv", options->csv, "Print CSV")->excludes(json);
    command->callback([options, &exitCode] { exitCode = runStats(*options); });
}

}  // namespace vexa::client
