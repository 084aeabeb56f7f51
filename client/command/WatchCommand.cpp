#include <CLI/CLI.hpp>
#include <array>
#include <ctime>
#include <iomanip>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/PortOption.h"
#include "client/hotspot/HotspotNarrator.h"
#include "client/machine/MachineRegistry.h"
#include "client/port/EventLines.h"
#include "client/spectrum/SpectralScan.h"
#include "client/spectrum/SpectralText.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/TerminalKeys.h"

namespace vexa::client {

namespace {

struct WatchOptions {
    PortOption spectral{Half::Spectral};
    PortOption hotspot{Half::Hotspot};
    int seconds = 0;
    bool json = false;
    bool showPasswords = false;
};

void say(const char* half, const std::string& sentence) {
    const std::time_t now = std::time(nullptr);
    std::cout << std::put_time(std::localtime(&now), "%H:%M:%S") << "  " << half << "  " << sentence << '\n';
}

/// Both halves of a service, and what they tell.
class Watch {
public:
    explicit Watch(const WatchOptions& options)
        : m_options(options),
          m_passwords(options.showPasswords ? Passwords::Shown : Passwords::Hidden),
          m_hotspot(options.hotspot.find()),
          m_spectral(options.spectral.find()),
          m_machine(options.hotspot.machine()),
          m_narrator([this] { return m_machine ? readConnectionMethod(*m_machine) : std::nullopt; }) {
        ask(HotspotNarrator::firstQuestions());
    }

    std::array<Polled, 2> polled() const { return {m_hotspot.polled(), m_spectral.polled()}; }

    /// Tells what has come. False once nobody reads it.
    bool tell() {
        tellHotspot();
        tellSpectral();
        std::cout << std::flush;
        return !std::cout.fail();
    }

private:
    void tellHotspot() {
        m_hotspot.process();
        while (const auto text = m_hotspot.take()) {
            const auto event = parseEvent(*text);
            if (m_options.json) std::cout << eventLine(*text, m_passwords) << '\n';
            if (!event) continue;
            for (const std::string& sentence : m_narrator.tell(*event)) {
                if (!m_options.json) say("hotspot ", sentence);
            }
            ask(m_narrator.takeQuestions());
        }
        m_hotspot.requireOpen();
    }

    void tellSpectral() {
        for (const auto& told : m_spectral.process()) {
            if (m_options.json)
                std::cout << eventLine(told.text) << '\n';
            else
                say("spectrum", describeEvent(told.event, told.update, m_spectral.view()));
        }
    }

    void ask(const std::vector<const char*>& questions) {
        for (const char* question : questions)
            m_hotspot.send(commandText(question));
    }

    const WatchOptions& m_options;
    Passwords m_passwords;
    WebSocketClient m_hotspot;
    SpectralScan m_spectral;
    std::optional<MachineFolder> m_machine;
    HotspotNarrator m_narrator;
};

int runWatch(const WatchOptions& options) {
    Signals signals;
    Watch watch(options);
    const Deadline end =
        options.seconds > 0 ? Deadline::in(std::chrono::seconds(options.seconds)) : Deadline::never();
    std::optional<TerminalKeys> keys;
    if (TerminalKeys::isUsable()) keys.emplace();
    EventLoop loop(signals, keys ? &*keys : nullptr);
    while (watch.tell() && !end.isOver()) {
        auto polled = watch.polled();
        if (!loop.wait(polled, end)) break;
    }
    return kExitOk;
}

}  // namespace

void addWatchCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<WatchOptions>();
    CLI::App* command =
        app.add_subcommand("watch", "Tell all that happens on both halves of the service, until q or Ctrl-C");
    PortOption::addBothTo(*command, options->spectral, options->hotspot);
    command->add_option("--for", options->seconds, "End after so many seconds; default: go on")
        ->type_name("SECONDS")
        ->check(CLI::Range(1, 86400));
    command->add_flag("--json", options->json, "Print JSON: an event a line");
    command->add_flag("--show-passwords", options->showPasswords, "Show the passwords too, in JSON");
    command->callback([options, &exitCode] { exitCode = runWatch(*options); });
}

}  // namespace vexa::client
