#include "simulation/modules/SpectralModule.h"

#include <algorithm>
#include <limits>

#include "simulation/modules/SpectralMessages.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

namespace {

constexpr std::uint8_t kMadeBin = 100;

std::uint16_t frequencyOf(int channel) {
    if (channel < 14) return static_cast<std::uint16_t>(2407 + 5 * channel);
    if (channel == 14) return 2484;
    return static_cast<std::uint16_t>(5000 + 5 * channel);
}

}  // namespace

SpectralModule::SpectralModule(std::optional<Spectrum> spectrum, std::uint64_t seed, Agenda& agenda,
                               NotificationQueue& notifications)
    : m_agenda(agenda), m_notifications(notifications), m_spectrum(std::move(spectrum)), m_random(seed) {}

DWORD SpectralModule::handle(const GUID& guid, IhvRequest kind, std::span<const std::uint8_t> request,
                             Bytes& answer) {
    {
        const LockGuard<Mutex> lock(m_mutex);
        if (!m_spectrum) return ERROR_NOT_SUPPORTED;
        if (kind == IhvRequest::ChannelList) {
            if (!isChannelListRequest(request)) return ERROR_INVALID_PARAMETER;
            answer = channelListAnswer(request, m_spectrum->channels);
            return ERROR_SUCCESS;
        }
    }
    const auto enable = readScanControl(request);
    if (!enable) return ERROR_INVALID_PARAMETER;
    if (*enable) {
        startScan(guid);
    } else {
        abandonScan();
    }
    return ERROR_SUCCESS;
}

bool SpectralModule::changeLevels(const JsonPlace& changes) {
    const LockGuard<Mutex> lock(m_mutex);
    if (m_spectrum) readLevels(changes, m_spectrum->levels);
    return m_spectrum.has_value();
}

bool SpectralModule::setScanTime(platform::Duration time) {
    const LockGuard<Mutex> lock(m_mutex);
    if (m_spectrum) m_spectrum->scanTime = time;
    return m_spectrum.has_value();
}

void SpectralModule::abandonScan() {
    const LockGuard<Mutex> lock(m_mutex);
    m_scanning = false;
}

void SpectralModule::startScan(const GUID& guid) {
    std::uint64_t scan = 0;
    platform::Duration end{};
    {
        const LockGuard<Mutex> lock(m_mutex);
        if (m_scanning) return;
        m_scanning = true;
        scan = ++m_scansStarted;
        end = platform::now() + m_spectrum->scanTime;
    }
    m_agenda.add(end, [this, scan, guid] { finishScan(scan, guid); });
}

void SpectralModule::finishScan(std::uint64_t scan, const GUID& guid) {
    ScanRecords records;
    bool completes = false;
    {
        const LockGuard<Mutex> lock(m_mutex);
        if (!m_scanning || scan != m_scansStarted) return;
        m_scanning = false;
        records = recordsOfScan();
        completes = m_spectrum->completes;
    }
    for (std::size_t at = 0; at < records.size(); at += kMaxRecordsPerMessage) {
        const auto part =
            std::span(records).subspan(at, std::min(kMaxRecordsPerMessage, records.size() - at));
        m_notifications.post({WLAN_NOTIFICATION_SOURCE_IHV, 0, guid, samplesMessage(part), nullptr});
    }
    if (!completes) return;
    m_notifications.post({WLAN_NOTIFICATION_SOURCE_IHV, 0, guid, scanCompletedMessage(), nullptr});
}

ScanRecords SpectralModule::recordsOfScan() {
    if (!m_spectrum->scans) return recordsOfLevels();
    const auto& scans = *m_spectrum->scans;
    return m_scansStarted <= scans.size() ? scans[m_scansStarted - 1] : ScanRecords{};
}

ScanRecords SpectralModule::recordsOfLevels() {
    ScanRecords records;
    const auto& channels = m_spectrum->channels;
    for (auto channel = channels.begin(); channel != channels.end(); ++channel) {
        const auto level = m_spectrum->levels.find(*channel);
        const bool seenBefore = std::find(channels.begin(), channel, *channel) != channel;
        if (level == m_spectrum->levels.end() || seenBefore) continue;
        for (int i = 0; i < m_spectrum->recordsPerScan; ++i)
            records.push_back(sample(*channel, level->second));
    }
    return records;
}

ScanRecord SpectralModule::sample(int channel, const SpectralLevel& level) {
    using Congestion = std::numeric_limits<std::uint16_t>;
    using Power = std::numeric_limits<std::int16_t>;
    ScanRecord record;
    record.frequency = frequencyOf(channel);
    record.congestion = static_cast<std::uint16_t>(
        around(level.congestion, level.spread, Congestion::min(), Congestion::max()));
    record.power = static_cast<std::int16_t>(around(level.power, level.spread, Power::min(), Power::max()));
    record.bins.fill(kMadeBin);
    return record;
}

// The library's distributions give other numbers elsewhere; the remainder is the same everywhere.
int SpectralModule::around(int value, int spread, int lowest, int highest) {
    const auto width = static_cast<std::uint64_t>(spread) * 2 + 1;
    const int offset = static_cast<int>(m_random() % width) - spread;
    return std::clamp(value + offset, lowest, highest);
}

}  // namespace vexa::simulation
