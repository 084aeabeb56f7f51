#pragma once

#include <chrono>

#include "client/command/PortOption.h"
#include "client/output/OutputOptions.h"

namespace vexa::client {

/// What all commands of the hotspot half let the user say.
struct HotspotOptions : OutputOptions {
    PortOption port{Half::Hotspot};
    int timeout = 10;

    /// `fields`: of what the command tells.
    void addTo(CLI::App& command, const FieldList& fields = {});
    std::chrono::seconds limit() const { return std::chrono::seconds(timeout); }
};

}  // namespace vexa::client
