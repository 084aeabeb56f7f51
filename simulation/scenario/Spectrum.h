#pragma once

#include <array>
#include <cstdint>
#include <map>
#include <optional>
#include <vector>

#include "platform/Clock.h"
#include "simulation/scenario/JsonPlace.h"

namespace vexa::simulation {

inline constexpr std::size_t kSpectralBins = 56;

/// What one channel sounds like: samples lie within `spread` around the two values.
struct SpectralLevel {
    int congestion = 0;
    int power = 0;
    int spread = 0;
};

/// Channel number to level. A channel without one is silent: it gives no records.
using SpectralLevels = std::map<int, SpectralLevel>;

/// One sample, as a scan of the scenario gives it.
struct ScanRecord {
    std::uint16_t frequency = 0;
    std::uint16_t congestion = 0;
    std::int16_t power = 0;
    std::array<std::uint8_t, kSpectralBins> bins{};
};

using ScanRecords = std::vector<ScanRecord>;

/// The spectral module of the scenario.
struct Spectrum {
    std::vector<int> channels;
    platform::Duration scanTime = std::chrono::milliseconds(400);
    bool completes = true;
    int recordsPerScan = 4;
    SpectralLevels levels;
    std::optional<std::vector<ScanRecords>> scans;  ///< If there, they take the place of the levels.
};

Spectrum readSpectrum(const JsonPlace& place);

/// Reads changes into `levels`: what a level doesn't name stays.
void readLevels(const JsonPlace& place, SpectralLevels& levels);

}  // namespace vexa::simulation
