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
#include "client/terminal/WaitNotice.h"

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
        const std::size_t current = view.currentChannels();
        const std::size_t told = view.knownChannels() + current;
        if (told == m_told) return;
        m_told = told;
        const bool all = view.hasChannelList() && current == view.channels().size();
        m_end = std::min(m_limit, Deadline::in(all ? kRestOfBurst : kQuietLimit));
    }

    /// How long to wait for more.
    Deadline end() const { return m_end; }

private:
    Deadline m_limit;
    Deadline m_end;
    std::size_t m_told = 0;
};

/// Throws ClientError if no value will come.
void requireHope(const SpectralView& view) {
    if (!view.hasChannelList() || view.knownChannels() > 0) return;
    if (view.cardIn() == false) throw ClientError("the adapter was taken out");
    if (view.radioOn() == false) throw ClientError("the radio is off, or no adapter is in");
    if (view.channels().empty()) throw ClientError("the adapter tells of no channels");
}

void scanOnce(SpectralScan& scan, Signals& signals, seconds limit) {
    EventLoop loop(signals);
    WaitNotice notice("values of the scan");
    Completeness completeness(limit);
    scan.start();
    while (!completeness.end().isOver()) {
        if (!loop.wait(scan.polled(), std::min({completeness.end(), scan.wake(), notice.due()}))) break;
        notice.tick();
        scan.renew();
        if (!scan.process().empty()) completeness.update(scan.view());
        requireHope(scan.view());
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
