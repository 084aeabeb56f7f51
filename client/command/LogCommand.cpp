#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/machine/LogFiles.h"
#include "client/machine/LogSwitch.h"
#include "client/machine/MachineFolder.h"
#include "client/machine/ServiceHost.h"
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
    bool json = false;
    bool redact = false;
};

void print(std::vector<LogFiles::Line> lines, std::size_t from, const LogOptions& options) {
    for (std::size_t i = from; i < lines.size(); ++i) {
        LogFiles::Line& line = lines[i];
        if (options.redact) line.text = withoutPassword(std::move(line.text));
        std::cout << (options.json ? jsonOf(line) : printable(line.text, Tabs::Kept)) << '\n';
    }
    std::cout << std::flush;
}

void follow(LogFiles& files, const LogOptions& options) {
    Signals signals;
    EventLoop loop(signals);
    while (std::cout && loop.wait(Deadline::in(kBetweenLooks)))
        print(files.takeLines(), 0, options);
}

void explainSilence(const std::string& reason, bool hasFile, bool goesOn) {
    if (hasFile && reason.empty()) return;
    const std::string line =
        reason.empty() ? "the log is on, but nothing is in it yet; lines come every 10 s" : reason;
    if (!hasFile && !goesOn) throw ClientError(line);
    std::cerr << "vexa: " << line << '\n';
}

int runLog(const LogOptions& options, bool isLimited) {
    const MachineFolder machine(options.machine);
    LogFiles files(machine.dumpFolder());
    explainSilence(whyLogIsOff(machine), files.any(), options.follow);
    if (isLimited) files.skipToLast(options.lines);
    auto lines = files.takeLines();
    if (!options.follow) {
        const auto rest = files.takeRest();
        lines.insert(lines.end(), rest.begin(), rest.end());
    }
    const bool isCut = isLimited && lines.size() > options.lines;
    print(lines, isCut ? lines.size() - options.lines : 0, options);
    if (options.follow) follow(files, options);
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
    command->add_flag("--json", options->json, "Print JSON, an object a line");
    CLI::Option* redact =
        command->add_flag("--redact,!--no-redact", options->redact, "Hide passwords; default: on a terminal");
    command->callback([options, lines, redact, &exitCode] {
        if (redact->count() == 0) options->redact = isOutputTerminal();
        exitCode = runLog(*options, lines->count() > 0);
    });
}

}  // namespace vexa::client
