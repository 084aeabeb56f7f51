#pragma once

#include <chrono>

#include "client/command/PortOption.h"

namespace vexa::client {

/// What all commands of the hotspot half let the user say.
struct HotspotOptions {
    PortOption port{Half::Hotspot};
    int timeout = 10;
    bool json = false;

    void addTo(CLI::App& command);
    std::chrono::seconds limit() const { return std::chrono::seconds(timeout); }
};

}  // namespace vexa::client
