#include <CLI/CLI.hpp>
#include <array>
#include <cmath>
#include <iomanip>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/PortOption.h"
#include "client/hotspot/HotspotNarrator.h"
#include "client/port/JsonLine.h"
#include "client/record/RecordingFile.h"
#include "client/record/RecordingWriter.h"
#include "client/spectrum/SpectralScan.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

constexpr std::int64_t kLongest = std::int64_t{366} * 24 * 3600;
constexpr std::chrono::milliseconds kBetweenQuestions{500};
constexpr std::chrono::milliseconds kStartLimit{5000};

struct RecordOptions {
    PortOption spectral{Half::Spectral};
    PortOption hotspot{Half::Hotspot};
    std::string file;
    std::int64_t seconds = 0;
    bool passive = false;
    bool showPasswords = false;
    bool json = false;
};

/// Both halves of a service, asked how things stand, and what they tell.
class Recorder {
public:
    explicit Recorder(const RecordOptions& options)
        : m_hotspot(options.hotspot.find()), m_spectral(options.spectral.find()) {
        ask(HotspotNarrator::firstQuestions());
        if (!options.passive) m_spectral.start();
    }

    std::array<Polled, 2> polled() const { return {m_hotspot.polled(), m_spectral.polled()}; }

    /// When it has something to ask although nothing has arrived.
    Deadline wake() const {
        return std::min(m_spectral.wake(), isWaiting() ? m_nextQuestion : Deadline::never());
    }

    /// Writes down what has come. Throws NoAnswer when the service has gone.
    void take(RecordingWriter& writer) {
        takeHotspot(writer);
        m_spectral.renew();
        for (const auto& told : m_spectral.process())
            writer.add(RecordedPort::Spectral, told.text);
        m_hotspot.requireOpen();
        if (isWaiting() && m_nextQuestion.isOver()) {
            m_nextQuestion = Deadline::in(kBetweenQuestions);
            ask({contract::kGetAllCredentialList, contract::kGetAllNetworkList});
        }
    }

private:
    // What happens doesn't tell all that it changes; the narrator knows what to ask then.
    void takeHotspot(RecordingWriter& writer) {
        m_hotspot.process();
        while (const auto text = m_hotspot.take()) {
            writer.add(RecordedPort::Hotspot, *text);
            const auto event = parseEvent(*text);
            if (!event) continue;
            m_hasLists = m_hasLists || event->id == contract::kGetAllCredentialList;
            m_narrator.tell(*event);
            ask(m_narrator.takeQuestions());
        }
    }

    // A service that has just started answers no question for a list until it knows its adapter.
    bool isWaiting() const { return !m_hasLists && !m_patience.isOver(); }

    void ask(const std::vector<const char*>& questions) {
        for (const char* question : questions)
            m_hotspot.send(commandText(question));
    }

    WebSocketClient m_hotspot;
    SpectralScan m_spectral;
    HotspotNarrator m_narrator{[] { return std::nullopt; }};
    bool m_hasLists = false;
    Deadline m_nextQuestion = Deadline::in(kBetweenQuestions);
    Deadline m_patience = Deadline::in(kStartLimit);
};

enum class End { Time, User, Service };

End record(Recorder& recorder, RecordingWriter& writer, Deadline end) try {
    Signals signals;
    EventLoop loop(signals);
    while (!end.isOver()) {
        auto polled = recorder.polled();
        if (!loop.wait(polled, std::min({end, writer.wake(), recorder.wake()}))) return End::User;
        recorder.take(writer);
        writer.flush();
    }
    return End::Time;
} catch (const NoAnswer&) {
    return End::Service;
}

// Where the recording itself goes to standard output, it must not stand among its lines.
void sayEnd(const RecordOptions& options, const RecordingWriter& writer, End end) {
    constexpr std::array kEnds{"time", "user", "service"};
    const double lasted = std::round(static_cast<double>(writer.elapsed().count()) / 100) / 10;
    std::ostream& output = options.file == kStandardStream ? std::cerr : std::cout;
    if (options.json) {
        Json::Value object(Json::objectValue);
        object["events"] = static_cast<Json::UInt64>(writer.eventCount());
        object["seconds"] = lasted;
        object["endedBy"] = kEnds[static_cast<std::size_t>(end)];
        output << jsonLine(object) << std::endl;
        return;
    }
    output << "Recorded " << counted(writer.eventCount(), "event") << " in " << std::fixed
           << std::setprecision(1) << lasted << " s"
           << (end == End::Service ? "; the service has ended." : ".") << std::endl;
}

int runRecord(const RecordOptions& options) {
    Recorder recorder(options);
    RecordingWriter writer(options.file, options.showPasswords);
    const Deadline limit =
        options.seconds > 0 ? Deadline::in(std::chrono::seconds(options.seconds)) : Deadline::never();
    const End end = record(recorder, writer, limit);
    writer.finish();
    sayEnd(options, writer, end);
    return kExitOk;
}

}  // namespace

void addRecordCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<RecordOptions>();
    CLI::App* command =
        app.add_subcommand("record", "Write all events of both halves of the service to a file");
    command->add_option("FILE", options->file, "A new file, compressed if it ends in .gz; -: standard output")
        ->required();
    PortOption::addBothTo(*command, options->spectral, options->hotspot);
    const std::map<std::string, std::int64_t> units{{"s", 1}, {"m", 60}, {"h", 3600}};
    command->add_option("--for", options->seconds, "End after this time, as in 90s, 10m, 2h; default: go on")
        ->type_name("TIME")
        ->transform(CLI::AsNumberWithUnit(units))
        ->check(CLI::Range(std::int64_t{1}, kLongest));
    command->add_flag("--passive", options->passive, "Start no scans; those of others are recorded");
    command->add_flag("--show-passwords", options->showPasswords,
                      "Write passwords of credentials into the file; default: mask them");
    command->add_flag("--json", options->json, "Print JSON at the end");
    command->callback([options, &exitCode] { exitCode = runRecord(*options); });
}

}  // namespace vexa::client
