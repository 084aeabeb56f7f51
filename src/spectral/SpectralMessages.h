#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "text/LittleEndian.h"

namespace vexa {

// The messages of the adapter's spectral module, little-endian and without padding.

inline constexpr std::uint32_t kSpectralSignature = 0x06C45E00;

inline constexpr std::size_t kScanControlSize = 32;
inline constexpr std::size_t kChannelListSize = 2092;

/// Starts one full scan, or stops it.
std::array<std::byte, kScanControlSize> scanControlRequest(bool enable);

/// Asks for the adapter's channels. The answer comes in the same buffer.
std::vector<std::byte> channelListRequest();

/// The channel numbers of an answer, in its order, repeats included; no more than lie within `answer`.
/// Nothing if it is too short to have any.
std::optional<std::vector<int>> parseChannelList(Bytes answer);

/// What the module measured on one channel, as it sent it.
class SampleRecord {
public:
    static constexpr std::size_t kSize = 236;
    static constexpr std::size_t kBinCount = 56;

    /// REQUIRES: kSize bytes.
    explicit SampleRecord(Bytes bytes);

    /// Centre frequency in MHz; 0 for none.
    std::uint16_t frequency() const { return readLittleEndian<std::uint16_t>(m_bytes, 0); }
    /// 0 to 100.
    std::uint16_t congestion() const { return readLittleEndian<std::uint16_t>(m_bytes, 2); }
    /// Level in dB, with -96 as its zero point. At an odd offset.
    std::int16_t power() const { return readLittleEndian<std::int16_t>(m_bytes, 7); }
    /// One magnitude for each frequency bin of the channel.
    std::span<const std::byte, kBinCount> bins() const { return Bytes(m_bytes).subspan<56, kBinCount>(); }

private:
    std::array<std::byte, kSize> m_bytes;
};

enum class SpectralSubtype : std::uint32_t { ChannelSamples = 1, ScanCompleted = 2 };

/// The subtype of a notification. REQUIRES: 16 bytes.
SpectralSubtype spectralSubtype(Bytes message);

/// The records of a notification of subtype ChannelSamples: none without the right magic, and none that does
/// not lie within the message, however many it announces.
std::vector<SampleRecord> parseSamples(Bytes message);

}  // namespace vexa
