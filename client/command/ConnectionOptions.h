#pragma once

#include <string>

#include "client/command/HotspotOptions.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

/// What joining and leaving let the user say.
struct ConnectionOptions {
    HotspotOptions hotspot;
    std::string network;
    bool noWait = false;

    /// `timeout`: the default, in seconds; `fields`: of what the command tells.
    void addTo(CLI::App& command, int timeout, const FieldList& fields);

    /// How long one question may take; the outcome may take longer.
    std::chrono::seconds answerLimit() const;
};

/// Says what was done: a sentence, or a JSON object with `verb` and the network, and what else belongs to it.
void sayDone(const ConnectionOptions& options, const char* verb, const std::string& sentence,
             Json::Value details = Json::Value(Json::objectValue));

/// Sees to it that the service gets the command for the network.
void tellOfNetwork(HotspotPort& port, const char* command, const std::string& network);

}  // namespace vexa::client
