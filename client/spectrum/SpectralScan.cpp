#include "client/spectrum/SpectralScan.h"

#include <algorithm>

#include "contract/Ports.h"

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

// A scan that tells nothing for so long is asked for again.
constexpr milliseconds kPatience{1500};
constexpr milliseconds kLongestPatience{10000};

bool isValue(const SpectralView::Update& update) {
    return update.change == SpectralView::Change::Congestion ||
           update.change == SpectralView::Change::Interference;
}

}  // namespace

SpectralScan::SpectralScan(std::uint16_t port) : m_client(port) {
    m_client.send(commandText(contract::kGetChannelList));
}

SpectralScan::~SpectralScan() {
    stop();
}

void SpectralScan::start() {
    m_scanning = true;
    m_hasValues = false;
    m_patience = kPatience;
    ask();
}

void SpectralScan::ask() {
    m_client.send(commandText(contract::kFullScan));
    m_asked = Deadline::Clock::now();
    m_renewal = Deadline::in(m_patience);
}

// What an adapter makes of a request in the middle of a scan is not known; one that begins anew has to get
// through with it at last.
void SpectralScan::renew() {
    if (!m_scanning || !m_renewal.isOver()) return;
    if (!m_hasValues) m_patience = std::min(2 * m_patience, kLongestPatience);
    m_isRenewed = m_hasValues;
    ask();
}

// The first values tell how long a scan takes.
void SpectralScan::takeValue() {
    if (!m_scanning) return;
    const auto taken = std::chrono::ceil<milliseconds>(Deadline::Clock::now() - m_asked);
    if (!m_hasValues) m_patience = std::max(kPatience, 2 * taken);
    m_hasValues = true;
    m_hasResumed = m_hasResumed || m_isRenewed;
    m_renewal = Deadline::in(m_patience);
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
        if (isValue(update)) takeValue();
        told.push_back({std::move(*text), *event, update});
    }
    if (told.empty()) m_client.requireOpen();
    return told;
}

}  // namespace vexa::client
