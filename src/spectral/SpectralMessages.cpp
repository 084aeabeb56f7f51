#include "spectral/SpectralMessages.h"

#include <algorithm>

namespace vexa {

namespace {

constexpr std::size_t kHeaderSize = 24;
constexpr std::uint32_t kMethodQuery = 0;
constexpr std::uint32_t kMethodSet = 1;
constexpr std::uint32_t kScanControlCode = 0xFFA3000B;
constexpr std::uint32_t kChannelListCode = 0xFF500004;

// An NDIS object header: type 0x80, revision 1, size 16.
constexpr std::uint32_t kNdisObjectHeader = 0x00100180;
constexpr std::uint32_t kChannelBufferSize = 2056;
constexpr std::size_t kCountOffset = 40;
constexpr std::size_t kEntriesOffset = 44;
constexpr std::size_t kEntrySize = 8;
constexpr std::size_t kChannelInEntry = 2;
constexpr std::size_t kMaxEntries = 256;
static_assert(kEntriesOffset + kMaxEntries * kEntrySize == kChannelListSize);

constexpr std::size_t kSubtypeOffset = 8;
constexpr std::size_t kMagicOffset = 12;
constexpr std::size_t kRecordCountOffset = 16;
constexpr std::size_t kRecordsOffset = 18;
constexpr std::uint32_t kMagic = 23602;

void writeHeader(std::span<std::byte> request, std::uint32_t method, std::uint32_t controlCode) {
    writeLittleEndian(request, 0, method);
    writeLittleEndian(request, 4, controlCode);
    writeLittleEndian(request, 12, static_cast<std::uint32_t>(request.size() - kHeaderSize));
}

}  // namespace

std::array<std::byte, kScanControlSize> scanControlRequest(bool enable) {
    std::array<std::byte, kScanControlSize> request{};
    writeHeader(request, kMethodSet, kScanControlCode);
    writeLittleEndian<std::uint32_t>(request, kHeaderSize, enable ? 1 : 0);
    return request;
}

std::vector<std::byte> channelListRequest() {
    std::vector<std::byte> request(kChannelListSize);
    writeHeader(request, kMethodQuery, kChannelListCode);
    writeLittleEndian(request, kHeaderSize, kNdisObjectHeader);
    writeLittleEndian(request, kHeaderSize + 4, kChannelBufferSize);
    writeLittleEndian(request, kHeaderSize + 8, kChannelBufferSize);
    return request;
}

std::optional<std::vector<int>> parseChannelList(Bytes answer) {
    if (answer.size() < kEntriesOffset) return std::nullopt;
    const std::size_t returned = (answer.size() - kEntriesOffset) / kEntrySize;
    const std::size_t announced = readLittleEndian<std::uint32_t>(answer, kCountOffset);
    std::vector<int> channels(std::min({announced, kMaxEntries, returned}));
    for (std::size_t i = 0; i < channels.size(); ++i)
        channels[i] = std::to_integer<int>(answer[kEntriesOffset + i * kEntrySize + kChannelInEntry]);
    return channels;
}

SampleRecord::SampleRecord(Bytes bytes) {
    std::copy_n(bytes.begin(), kSize, m_bytes.begin());
}

SpectralSubtype spectralSubtype(Bytes message) {
    return static_cast<SpectralSubtype>(readLittleEndian<std::uint32_t>(message, kSubtypeOffset));
}

std::vector<SampleRecord> parseSamples(Bytes message) {
    std::vector<SampleRecord> records;
    if (message.size() < kRecordsOffset) return records;
    if (readLittleEndian<std::uint32_t>(message, kMagicOffset) != kMagic) return records;
    const std::size_t fitting = (message.size() - kRecordsOffset) / SampleRecord::kSize;
    const std::size_t announced = readLittleEndian<std::uint16_t>(message, kRecordCountOffset);
    const std::size_t count = std::min(announced, fitting);
    records.reserve(count);
    for (std::size_t i = 0; i < count; ++i)
        records.emplace_back(message.subspan(kRecordsOffset + i * SampleRecord::kSize, SampleRecord::kSize));
    return records;
}

}  // namespace vexa
