#pragma once

#include <cstdint>
#include <string>

#include "client/command/PortOption.h"
#include "client/terminal/Signals.h"

namespace vexa::client {

struct PanelOptions {
    PortOption spectral{Half::Spectral};
    PortOption hotspot{Half::Hotspot};
    /// 0: a free one.
    std::uint16_t port = 0;
    std::string recordings;
    int linger = 30;
    bool noOpen = false;
    bool demo = false;
    bool json = false;
};

/// Serves the panel until the user has had enough, or has closed its page. Gives the exit code.
int servePanel(const PanelOptions& options, Signals& signals);

/// The same for the machine of the demo, with its service and credentials, which live as long. Null where
/// there are no simulated machines.
using ServePanel = int (*)(PanelOptions& options, Signals& signals);
ServePanel demoPanel();

}  // namespace vexa::client
