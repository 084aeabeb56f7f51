#include "client/command/ConnectionOptions.h"

#include <CLI/CLI.hpp>
#include <algorithm>

#include "client/command/Output.h"
#include "client/hotspot/Network.h"

namespace vexa::client {

namespace {

constexpr std::chrono::seconds kAnswerLimit{10};

}  // namespace

void ConnectionOptions::addTo(CLI::App& command, int timeout, const FieldList& fields) {
    hotspot.timeout = timeout;
    hotspot.addTo(command, fields);
    command.add_flag("--no-wait", noWait, "Do not wait for what comes of it");
}

std::chrono::seconds ConnectionOptions::answerLimit() const {
    return std::min(hotspot.limit(), kAnswerLimit);
}

void sayDone(const ConnectionOptions& options, const char* verb, const std::string& sentence,
             Json::Value details) {
    details["done"] = verb;
    details["network"] = options.network;
    print(options.hotspot, details, sentence);
}

void tellOfNetwork(HotspotPort& port, const char* command, const std::string& network) {
    port.tell(command, networkData(network));
}

}  // namespace vexa::client
