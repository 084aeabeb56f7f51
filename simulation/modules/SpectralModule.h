#pragma once

#include <cstdint>
#include <optional>
#include <random>
#include <span>

#include "platform/Mutex.h"
#include "platform/WlanApi.h"
#include "simulation/modules/IhvRequests.h"
#include "simulation/parts/Agenda.h"
#include "simulation/parts/NotificationQueue.h"
#include "simulation/scenario/Spectrum.h"

namespace vexa::simulation {

/// The spectral half of the adapter: gives its list of channels and scans them, one scan at a time. The
/// samples of a scan come just before its completion. Any thread.
class SpectralModule {
public:
    /// Without a spectrum every request fails.
    SpectralModule(std::optional<Spectrum> spectrum, std::uint64_t seed, Agenda& agenda,
                   NotificationQueue& notifications);

    /// Carries out a Scan or ChannelList request; `answer` gets what is to be returned.
    DWORD handle(const GUID& guid, IhvRequest kind, std::span<const std::uint8_t> request, Bytes& answer);

    /// False: there is no spectrum to change.
    bool changeLevels(const JsonPlace& changes);
    bool setScanTime(platform::Duration time);

    /// Ends the scan without a word.
    void abandonScan();

private:
    void startScan(const GUID& guid);
    void finishScan(std::uint64_t scan, const GUID& guid);
    ScanRecords recordsOfScan() REQUIRES(m_mutex);
    ScanRecords recordsOfLevels() REQUIRES(m_mutex);
    ScanRecord sample(int channel, const SpectralLevel& level) REQUIRES(m_mutex);
    int around(int value, int spread, int lowest, int highest) REQUIRES(m_mutex);

    Agenda& m_agenda;
    NotificationQueue& m_notifications;
    platform::Mutex m_mutex;
    std::optional<Spectrum> m_spectrum GUARDED_BY(m_mutex);
    std::mt19937_64 m_random GUARDED_BY(m_mutex);
    std::uint64_t m_scansStarted GUARDED_BY(m_mutex) = 0;
    bool m_scanning GUARDED_BY(m_mutex) = false;
};

}  // namespace vexa::simulation
