#include "client/shell/ServiceNames.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <chrono>
#include <future>
#include <memory>
#include <thread>

#include "client/command/PortOption.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/port/HotspotPort.h"
#include "client/spectrum/SpectralScan.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using Names = std::vector<std::string>;

/// The user waits with a finger on the key.
constexpr std::chrono::milliseconds kLimit{300};

/// The port that the line means, whatever else stands on it.
PortOption portOn(const Names& words, Half half) {
    PortOption port(half);
    CLI::App line;
    line.set_help_flag();
    port.addTo(line);
    line.allow_extras();
    line.parse(Names(words.rbegin(), words.rend()));
    return port;
}

Names networkNames(HotspotPort& port) {
    Names names;
    for (const Network& network : askNetworks(port).value_or(NetworkList()))
        names.push_back(printable(network.name));
    return names;
}

/// By its name, or by its id where another has the same name or the name does not show as it is.
Names credentialNames(HotspotPort& port) {
    const CredentialList list = askCredentials(port);
    Names names;
    for (const Credential& credential : list) {
        const auto isNamesake = [&](const Credential& other) { return other.name == credential.name; };
        const bool isOnly = std::count_if(list.begin(), list.end(), isNamesake) == 1 &&
                            printable(credential.name) == credential.name;
        names.push_back(isOnly ? credential.name : std::to_string(credential.id));
    }
    return names;
}

Names channelNames(const Names& words, Signals& signals) {
    SpectralScan scan(portOn(words, Half::Spectral).find());
    EventLoop loop(signals);
    while (!scan.view().hasChannelList() && loop.wait(scan.polled(), Deadline::in(kLimit)))
        scan.process();
    Names names;
    for (const auto& channel : scan.view().channels())
        names.push_back(std::to_string(channel.number));
    return names;
}

Names ask(const std::string& kind, const Names& words) {
    Signals signals;
    if (kind == "channels") return channelNames(words, signals);
    HotspotPort port(portOn(words, Half::Hotspot).find(), signals, kLimit);
    return kind == "networks" ? networkNames(port) : credentialNames(port);
}

}  // namespace

std::vector<std::string> serviceNames(const std::string& kind, const std::vector<std::string>& words) {
    auto answer = std::make_shared<std::promise<Names>>();
    std::future<Names> names = answer->get_future();
    std::thread([answer, kind, words] {
        try {
            answer->set_value(ask(kind, words));
        } catch (...) {  // nobody to ask is no reason to disturb the line
            answer->set_value({});
        }
    }).detach();
    if (names.wait_for(kLimit) != std::future_status::ready) return {};
    return names.get();
}

}  // namespace vexa::client
