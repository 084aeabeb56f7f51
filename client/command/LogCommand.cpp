#include <CLI/CLI.hpp>
#include <deque>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/log/LogFilter.h"
#include "client/log/LogPasswords.h"
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
constexpr int kMostLines = 1000000000;

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

/// What goes out of the log: all of it at once, or its end alone.
class Outlet {
public:
    Outlet(const LogOptions& options, LogPasswords passwords, bool isLimited)
        : m_options(options), m_passwords(std::move(passwords)), m_isLimited(isLimited) {}

    void take(LogFilter::Lines lines) {
        for (LogFiles::Line& line : lines) {
            if (m_options.redact && !hidePassword(line)) continue;
            if (m_isLimited)
                keep(std::move(line));
            else
                print(line);
        }
    }

    /// What was kept of the end; from now on everything goes out.
    void open() {
        m_isLimited = false;
        for (const LogFiles::Line& line : m_kept)
            print(line);
        m_kept.clear();
        std::cout << std::flush;
    }

private:
    /// False if nothing of the line is left.
    bool hidePassword(LogFiles::Line& line) {
        auto shown = m_passwords.shown(line);
        if (shown) line.text = std::move(*shown);
        return shown.has_value();
    }

    void keep(LogFiles::Line line) {
        m_kept.push_back(std::move(line));
        if (m_kept.size() > m_options.lines) m_kept.pop_front();
    }

    void print(const LogFiles::Line& line) { std::cout << shown(line, m_options.output) << '\n'; }

    const LogOptions& m_options;
    LogPasswords m_passwords;
    bool m_isLimited;
    std::deque<LogFiles::Line> m_kept;
};

void follow(LogFiles& files, LogFilter& filter, Outlet& outlet) {
    Signals signals;
    EventLoop loop(signals);
    while (std::cout && loop.wait(Deadline::in(kBetweenLooks))) {
        outlet.take(filter.take(files.takeLines()));
        std::cout << std::flush;
    }
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
    LogPasswords passwords;
    if (isLimited && !options.wish.isAny())
        passwords.beginWithin(
            files.skipToLast(options.lines + (options.redact ? LogPasswords::kLinesBefore : 0)));
    LogFilter filter(options.wish, std::time(nullptr));
    Outlet outlet(options, std::move(passwords), isLimited);
    files.takeLines([&](LogFilter::Lines&& lines) { outlet.take(filter.take(lines)); });
    if (!options.follow) {
        outlet.take(filter.take(files.takeRest()));
        outlet.take(filter.takeRest());
    }
    outlet.open();
    if (options.follow) follow(files, filter, outlet);
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
    lines->type_name("LINES")->check(CLI::Range(0, kMostLines));
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
