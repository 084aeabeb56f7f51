#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/Output.h"
#include "client/command/PortOption.h"
#include "client/spectrum/SpectralText.h"
#include "client/spectrum/SpectrumWatch.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;

constexpr int kDefaultTimeout = 15;

// The values of one scan come in one burst.
constexpr milliseconds kRestOfBurst{200};
// Channels that have told nothing this long after the others have no values to tell.
constexpr milliseconds kQuietLimit{3000};

struct ScanOptions {
    PortOption port{Half::Spectral};
    int timeout = kDefaultTimeout;
    bool watch = false;
    OutputOptions output;
};

/// Decides when a scan has told enough.
class Completeness {
public:
    explicit Completeness(seconds limit) : m_limit(Deadline::in(limit)), m_end(m_limit) {}

    /// To be called when the view has changed.
    void update(const SpectralView& view) {
        const std::size_t known = view.knownChannels();
        if (known == m_known) return;
        m_known = known;
        const bool all = view.hasChannelList() && known == view.channels().size();
        m_end = std::min(m_limit, Deadline::in(all ? kRestOfBurst : kQuietLimit));
    }

    /// How long to wait for more.
    Deadline end() const { return m_end; }

private:
    Deadline m_limit;
    Deadline m_end;
    std::size_t m_known = 0;
};

void scanOnce(SpectralScan& scan, Signals& signals, seconds limit) {
    EventLoop loop(signals);
    Completeness completeness(limit);
    scan.start();
    while (!completeness.end().isOver()) {
        if (!loop.wait(scan.polled(), completeness.end())) break;
        if (!scan.process().empty()) completeness.update(scan.view());
    }
    scan.stop();
}

int runScan(const ScanOptions& options) {
    Signals signals;
    SpectralScan scan(options.port.find());
    if (options.watch) {
        SpectrumOutput output(options.output.json ? SpectrumOutput::Form::Json
                                                  : SpectrumOutput::Form::Readable);
        watchSpectrum(scan, signals, output, Deadline::never());
        return kExitOk;
    }
    scanOnce(scan, signals, seconds(options.timeout));
    print(options.output, spectrumJson(scan.view()), spectrumTable(scan.view()));
    if (scan.view().knownChannels() > 0) return kExitOk;
    throw ClientError("no channel told a value within " + std::to_string(options.timeout) + " s");
}

}  // namespace

void addScanCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ScanOptions>();
    CLI::App* command =
        app.add_subcommand("scan", "Scan the spectrum and show congestion and interference per channel");
    options->port.addTo(*command);
    CLI::Option* watch = command->add_flag(
        "--watch", options->watch, "Go on, as bars in the terminal or a line per event, until q or Ctrl-C");
    command->add_option("--timeout", options->timeout, "Seconds to wait for values at most; default 15")
        ->type_name("N")
        ->check(CLI::Range(1, 3600));
    options->output.addTo(*command, {{{"channel", "Channel"},
                                      {"order", "Order"},
                                      {"congestion", "Congestion"},
                                      {"interference", "Interference"}},
                                     "channels"});
    watch->excludes(command->get_option("--fields"))->excludes(command->get_option("--terse"));
    command->callback([options, &exitCode] { exitCode = runScan(*options); });
}

}  // namespace vexa::client
