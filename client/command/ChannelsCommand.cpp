#include <json/value.h>

#include <CLI/CLI.hpp>
#include <iomanip>
#include <iostream>
#include <memory>
#include <sstream>

#include "client/command/Commands.h"
#include "client/command/Output.h"
#include "client/command/PortOption.h"
#include "client/spectrum/SpectralScan.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

constexpr std::chrono::seconds kChannelLimit{10};

struct ChannelsOptions {
    PortOption port{Half::Spectral};
    OutputOptions output;
};

bool waitForList(SpectralScan& scan, Signals& signals) {
    EventLoop loop(signals);
    const Deadline deadline = Deadline::in(kChannelLimit);
    while (!scan.view().hasChannelList()) {
        if (deadline.isOver()) throw ClientError("the service did not answer");
        if (!loop.wait(scan.polled(), deadline)) return false;
        scan.process();
    }
    return true;
}

std::vector<std::string> channelTable(const SpectralView& view) {
    std::vector<std::string> lines{"Channel"};
    for (const auto& channel : view.channels()) {
        std::ostringstream line;
        line << std::setw(7) << channel.number;
        lines.push_back(line.str());
    }
    return lines;
}

Json::Value channelsJson(const SpectralView& view) {
    Json::Value list(Json::arrayValue);
    for (const auto& channel : view.channels()) {
        Json::Value entry(Json::objectValue);
        entry["channel"] = channel.number;
        entry["order"] = channel.order;
        list.append(entry);
    }
    return list;
}

int runChannels(const ChannelsOptions& options) {
    Signals signals;
    SpectralScan scan(options.port.find());
    if (!waitForList(scan, signals)) return kExitOk;
    print(options.output, channelsJson(scan.view()), channelTable(scan.view()));
    if (scan.view().channels().empty()) std::cerr << "vexa: the service knows no channels\n";
    return kExitOk;
}

}  // namespace

void addChannelsCommand(CLI::App& app, int& exitCode) {
    auto options = std::make_shared<ChannelsOptions>();
    CLI::App* command = app.add_subcommand("channels", "List the channels of the adapter");
    options->port.addTo(*command);
    options->output.addTo(*command, {{{"channel", "Channel"}, {"order", "Order"}}});
    command->callback([options, &exitCode] { exitCode = runChannels(*options); });
}

}  // namespace vexa::client
