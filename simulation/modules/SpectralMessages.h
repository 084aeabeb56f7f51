#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "simulation/scenario/Spectrum.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

// The messages of the spectral module, as bytes.

inline constexpr std::uint32_t kScanControlCode = 0xFFA3000B;
inline constexpr std::uint32_t kChannelListCode = 0xFF500004;
inline constexpr std::size_t kSpectralHeaderSize = 24;
inline constexpr std::size_t kControlCodeAt = 4;
inline constexpr std::size_t kChannelListSize = 2092;
inline constexpr std::size_t kMaxRecordsPerMessage = 16;

/// Whether a scan is to start (true) or to stop; nothing if the request is not well-formed.
std::optional<bool> readScanControl(std::span<const std::uint8_t> request);

bool isChannelListRequest(std::span<const std::uint8_t> request);

/// Fills the answer into a copy of the request: at most 256 channels, and how many there are in all.
Bytes channelListAnswer(std::span<const std::uint8_t> request, const std::vector<int>& channels);

/// A notification with up to kMaxRecordsPerMessage samples.
Bytes samplesMessage(std::span<const ScanRecord> records);

Bytes scanCompletedMessage();

}  // namespace vexa::simulation
