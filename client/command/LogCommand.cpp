#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/log/LogFilter.h"
#include "client/machine/LogFiles.h"
#include "client/machine/LogSwitch.h"
#include "client/machine/MachineFolder.h"
#include "client/machine/ServiceHost.h"
#include "client/output/Records.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr std::chrono::milliseconds kBetweenLooks{200};

struct LogOptions {
    std::string machine;
    std::size_t lines = 0;
    bool follow = false;
    bool redact = false;
    OutputOptions output;
    LogWish wish;
};

std::string shown(const LogFiles::Line& line, const OutputOptions& options) {
    if (options.json) return recordsJson(options, lineJson(line));
    if (options.terse || !options.chosen.empty()) return terseLines(options, lineJson(line)).front();
    return printable(line.text, Tabs::Kept);
}

void print(std::vector<LogFiles::Line> lines, std::size_t from, const LogOptions& options) {
    for (std::size_t i = from; i < lines.size(); ++i) {
        LogFiles::Line& line = lines[i];
        if (options.redact) line.text = withoutPassword(std::move(line.text));
        std::cout << shown(line, options.output) << '\n';
    }
    std::cout << std::flush;
}

void follow(LogFiles& files, LogFilter& filter, const LogOptions& options) {
    Signals signals;
    EventLoop loop(signals);
    while (std::cout && loop.wait(Deadline::in(kBetweenLooks)))
        print(filter.take(files.takeLines()), 0, options);
}

void explainSilence(const std::string& reason, bool hasFile, bool goesOn) {
    if (hasFile && reason.empty()) return;
    const std::string line =
        reason.empty() ? "the log is on, but nothing is in it yet; lines come every 10 s" : reason;
    if (!hasFile && !goesOn) throw ClientError(line);
    std::cerr << "vexa: " << line << '\n';
}

void append(LogFilter::Lines& lines, const LogFilter::Lines& more) {
    lines.insert(lines.end(), more.begin(), more.end());
}

int runLog(const LogOptions& options, bool isLimited) {
    const MachineFolder machine(options.machine);
    LogFiles files(machine.dumpFolder());
    explainSilence(whyLogIsOff(machine), files.any(), options.follow);
    if (isLimited && !options.wish.isAny()) files.skipToLast(options.lines);
    LogFilter filter(options.wish, std::time(nullptr));
    auto lines = filter.take(files.takeLines());
    if (!options.follow) {
        append(lines, filter.take(files.takeRest()));
        append(lines, filter.takeRest());
    }
    const bool isCut = isLimited && lines.size() > options.lines;
    print(lines, isCut ? lines.size() - options.lines : 0, options);
    if (options.follow) follow(files, filter, options);
    return kExitOk;
}

}  // namespace

void addLogCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<LogOptions>();
    CLI::App* command = app.add_subcommand("log", "Print the diagnostic log of a machine, the newest last");
    if (hasSimulatedMachines())
        command->add_option("--machine", options->machine, "Folder of the machine")->type_name("DIR");
    CLI::Option* lines =
        command->add_option("-n,--lines", options->lines, "The last lines alone; default: all");
    lines->type_name("LINES")->check(CLI::NonNegativeNumber);
    command->add_flag("-f,--follow", options->follow, "Go on with what is written, until Ctrl-C");
    options->wish.addTo(*command);
    options->output.addTo(*command, {{{"file", "File"}, {"line", "Line"}}}, "Print JSON, an object a line");
    CLI::Option* redact =
        command->add_flag("--redact,!--no-redact", options->redact, "Hide passwords; default: on a terminal");
    command->callback([options, lines, redact, &exitCode] {
        if (redact->count() == 0) options->redact = isOutputTerminal();
        exitCode = runLog(*options, lines->count() > 0);
    });
}

}  // namespace vexa::client
