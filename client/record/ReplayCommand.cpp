#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/machine/ServicePorts.h"
#include "client/machine/TcpPorts.h"
#include "client/port/JsonLine.h"
#include "client/record/RecordingReader.h"
#include "client/record/ReplayPorts.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using std::chrono::milliseconds;

// How often it is looked whether clients have come or gone, and what they wanted.
constexpr milliseconds kBetweenClientLooks{100};
// A client that comes at the beginning asks before the recorder's own questions are answered.
constexpr RecordedTime kBeginning{1000};

struct ReplayOptions {
    std::string file;
    double speed = 1;
    std::uint16_t spectral = 0;
    std::uint16_t hotspot = 0;
    bool loop = false;
    bool json = false;
};

/// A member on a line of its own, or a sentence.
void say(const ReplayOptions& options, const char* member, const Json::Value& value,
         const std::string& sentence) {
    Json::Value object(Json::objectValue);
    object[member] = value;
    std::cout << (options.json ? jsonLine(object) : sentence) << std::endl;
}

/// The port that was given, or a free one that nobody else takes meanwhile.
class ReplayPort {
public:
    explicit ReplayPort(std::uint16_t given)
        : m_reserved(given == 0 ? TcpPorts::read().reserveFree() : ReservedPort{given, {}}) {}

    std::uint16_t number() const { return m_reserved.port; }

private:
    ReservedPort m_reserved;
};

std::vector<RecordedEvent> beginningOf(const std::string& file) {
    RecordingReader reader(file);
    std::vector<RecordedEvent> events;
    while (auto recorded = reader.next()) {
        if (recorded->at > kBeginning) break;
        events.push_back(std::move(*recorded));
    }
    return events;
}

/// Plays a recording on the ports while the user lets it.
class Replay {
public:
    Replay(const ReplayOptions& options, ReplayPorts& ports, Signals& signals)
        : m_options(options), m_ports(ports), m_loop(signals) {}

    void run() {
        const auto beginning = beginningOf(m_options.file);
        m_ports.begin(beginning);
        if (!waitWhile([this] { return !m_ports.hasClients(); })) return;
        do {
            m_ports.begin(beginning);
            if (!playOnce()) return;
        } while (m_options.loop);
        say(m_options, "events", static_cast<Json::UInt64>(m_eventCount),
            "The recording has ended: " + counted(m_eventCount, "event") + ".");
        waitWhile([this] { return m_ports.hasClients(); });
    }

private:
    bool playOnce() {
        RecordingReader reader(m_options.file);
        m_start = std::chrono::steady_clock::now();
        m_eventCount = 0;
        while (const auto recorded = reader.next()) {
            if (!waitUntil(recorded->at)) return false;
            m_ports.tell(*recorded);
            ++m_eventCount;
        }
        // A recording that is over at once is not played again at once.
        return waitUntil(reader.duration()) && waitFor(kBetweenClientLooks);
    }

    bool waitUntil(RecordedTime time) {
        using Exact = std::chrono::duration<double, std::milli>;
        const auto due = m_start + std::chrono::ceil<milliseconds>(Exact(time) / m_options.speed);
        for (auto now = std::chrono::steady_clock::now(); now < due; now = std::chrono::steady_clock::now()) {
            if (!waitFor(std::min(std::chrono::ceil<milliseconds>(due - now), kBetweenClientLooks)))
                return false;
        }
        return true;
    }

    template <class Condition>
    bool waitWhile(Condition holds) {
        while (holds()) {
            if (!waitFor(kBetweenClientLooks)) return false;
        }
        return true;
    }

    /// False: the user has had enough.
    bool waitFor(milliseconds time) {
        const bool goesOn = m_loop.wait(Deadline::in(time));
        for (const std::string& command : m_ports.takeRefused())
            say(m_options, "refused", command, command + " changes nothing: this is a recording.");
        return goesOn;
    }

    const ReplayOptions& m_options;
    ReplayPorts& m_ports;
    EventLoop m_loop;
    std::chrono::steady_clock::time_point m_start;
    std::size_t m_eventCount = 0;
};

void sayHow(const RecordingHeader& header, const std::string& sa, const std::string& hs20) {
    std::cout << "Recorded at " << printable(header.started) << " by vexa " << printable(header.version)
              << "; it begins when somebody looks:\n"
              << "  vexa scan --watch --port " << sa << "\n  vexa networks --watch --port " << hs20
              << "\n  vexa watch --sa-port " << sa << " --hs20-port " << hs20 << std::endl;
}

int runReplay(const ReplayOptions& options) {
    const RecordingHeader header = RecordingReader(options.file).header();
    const ReplayPort spectral(options.spectral);
    const ReplayPort hotspot(options.hotspot);
    // Before any thread of the ports: none of them is to take a signal.
    Signals signals;
    ReplayPorts ports(spectral.number(), hotspot.number());
    if (options.json)
        std::cout << jsonLine(portsJson({spectral.number(), hotspot.number()})) << std::endl;
    else
        sayHow(header, std::to_string(spectral.number()), std::to_string(hotspot.number()));
    Replay(options, ports, signals).run();
    return kExitOk;
}

}  // namespace

void addReplayCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ReplayOptions>();
    CLI::App* command = app.add_subcommand(
        "replay", "Be the service of a recording, on two ports, for other commands to look at");
    command->add_option("FILE", options->file, "The recording")->required();
    command->add_option("--speed", options->speed, "So many times as fast; default 1")
        ->type_name("N")
        ->check(CLI::Range(0.01, 10000.0));
    command->add_option("--sa-port", options->spectral, "Port of the spectral analyser; default: a free one")
        ->type_name("N")
        ->check(CLI::Range(1, 65535));
    command->add_option("--hs20-port", options->hotspot, "Port of the hotspot half; default: a free one")
        ->type_name("N")
        ->check(CLI::Range(1, 65535));
    command->add_flag("--loop", options->loop, "Begin again at the end, until Ctrl-C");
    command->add_flag("--json", options->json, "Print JSON: the ports, what was refused, the end");
    command->callback([options, &exitCode] { exitCode = runReplay(*options); });
}

}  // namespace vexa::client
