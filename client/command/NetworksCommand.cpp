#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/hotspot/Network.h"
#include "client/port/HotspotPort.h"
#include "client/terminal/ListScreen.h"
#include "client/terminal/TerminalKeys.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

struct NetworksOptions {
    HotspotOptions hotspot;
    bool watch = false;
};

std::vector<std::string> linesOf(const NetworkList& list) {
    return list.empty() ? std::vector<std::string>{"No hotspot networks."} : networkTable(list);
}

bool show(const NetworkList& list, const OutputOptions& options) {
    return print(options, networksJson(list), linesOf(list));
}

/// An empty list has reasons that the list does not tell.
void explain(HotspotPort& port, const HotspotOptions& options) {
    const auto isOn = hotspotSwitch(options.port.machine());
    if (!askRadio(port)) {
        std::cerr << "vexa: the radio is off\n";
    } else if (isOn && !*isOn) {
        std::cerr << "vexa: hotspot networks are disabled: `vexa enable` enables them\n";
    }
}

// How many there are, and the names of the columns.
constexpr std::size_t kHeadingRows = 2;

/// Only its own words are drawn.
bool isDrawn(const OutputOptions& options) {
    return !options.json && !options.terse && options.chosen.empty() && TerminalScreen::isUsable();
}

/// The lists of a service, one after the other.
class Watch {
public:
    Watch(HotspotPort& port, std::optional<NetworkList> first, const OutputOptions& options)
        : m_port(port), m_list(std::move(first)), m_options(options) {}

    /// Until the user has had enough, or nobody reads any more.
    void run() try {
        if (isDrawn(m_options)) {
            m_port.endWith(m_screen.emplace());
        } else if (TerminalKeys::isUsable()) {
            m_port.endWith(m_keys.emplace());
        }
        if (m_screen) draw();
        while (next()) {
        }
    } catch (const StoppedByUser&) {
        if (!m_screen) return;
        m_screen.reset();
        show(m_list.value_or(NetworkList()), m_options);
    }

private:
    // An adapter that comes is asked for its list; all later lists come by themselves.
    bool next() {
        const auto event = m_port.next(Deadline::never());
        if (event->id == contract::kCardPlugIn) m_port.tell(contract::kGetAllNetworkList);
        if (event->id == contract::kCardPlugOut && m_screen) m_list.reset();
        if (event->id == contract::kGetAllNetworkList) {
            NetworkList list = networkList(payloadOf(*event));
            if (list == m_list) return true;
            m_list = std::move(list);
            if (!m_screen && !m_options.json) std::cout << '\n';
            if (!m_screen && !show(*m_list, m_options)) return false;
        }
        if (m_screen) draw();
        return true;
    }

    void draw() {
        auto lines = m_list ? linesOf(*m_list) : std::vector<std::string>{kNoAdapter};
        lines.insert(lines.begin(),
                     counted(m_list.value_or(NetworkList()).size(), "network") + "   (q or Ctrl-C ends)");
        m_screen->show(std::move(lines), kHeadingRows);
    }

    HotspotPort& m_port;
    std::optional<NetworkList> m_list;
    const OutputOptions& m_options;
    std::optional<ListScreen> m_screen;
    std::optional<TerminalKeys> m_keys;
};

int runNetworks(const NetworksOptions& options) {
    Signals signals;
    HotspotPort port(options.hotspot.port.find(), signals, options.hotspot.limit());
    const auto list = askNetworks(port);
    if (!list && !options.watch) throw ClientError(kNoAdapter);
    const bool isPicture = options.watch && isDrawn(options.hotspot);
    if (!list) std::cerr << "vexa: " << kNoAdapter << '\n';
    if (list && !isPicture && !show(*list, options.hotspot)) return kExitOk;
    if (list && list->empty() && !options.hotspot.json) explain(port, options.hotspot);
    if (options.watch) Watch(port, list, options.hotspot).run();
    return kExitOk;
}

}  // namespace

void addNetworksCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<NetworksOptions>();
    CLI::App* command =
        app.add_subcommand("networks", "List the hotspot networks in range, with their realms");
    options->hotspot.addTo(
        *command,
        {{{"name", "Network"}, {"connected", "Connected"}, {"internet", "Internet"}, {"realms", "Realms"}}});
    command->add_flag("--watch", options->watch, "Go on with every list that differs, until q or Ctrl-C");
    command->callback([options, &exitCode] { exitCode = runNetworks(*options); });
}

}  // namespace vexa::client
