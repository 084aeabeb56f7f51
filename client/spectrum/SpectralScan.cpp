#include "client/spectrum/SpectralScan.h"
#include "contract/Ports.h"

namespace vexa::client {

SpectralScan::SpectralScan(std::uint16_t port) : m_client(port) {
    m_client.send(commandText(contract::kGetChannelList));
}

SpectralScan::~SpectralScan() {
    stop();
}

void SpectralScan::start() {
    m_client.send(commandText(contract::kFullScan));
    m_scanning = true;
}

void SpectralScan::stop() {
    if (m_scanning) m_client.send(commandText(contract::kStopScan));
    m_scanning = false;
}

std::vector<SpectralScan::Told> SpectralScan::process() {
    m_client.process();
    std::vector<Told> told;
    while (auto text = m_client.take()) {
        const auto event = parseEvent(*text);
        if (!event) continue;
        const auto update = m_view.apply(*event);
        told.push_back({std::move(*text), *event, update});
    }
    if (told.empty()) m_client.requireOpen();
    return told;
}

}  // namespace vexa::client
