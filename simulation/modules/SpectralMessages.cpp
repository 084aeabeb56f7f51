#include "simulation/modules/SpectralMessages.h"

#include <algorithm>

#include "simulation/text/Wire.h"

namespace vexa::simulation {

namespace {

// Requests.
constexpr std::size_t kMethodAt = 0;
constexpr std::size_t kSpectralLengthAt = 12;
constexpr std::size_t kScanControlSize = 32;
constexpr std::size_t kEnableAt = 24;
constexpr std::size_t kObjectHeaderAt = 24;
constexpr std::size_t kBufferSizeAt = 28;
constexpr std::size_t kBufferSizeAgainAt = 32;
constexpr std::size_t kCountAt = 40;
constexpr std::size_t kFirstChannelAt = 46;
constexpr std::size_t kChannelEntrySize = 8;
constexpr std::size_t kMaxChannels = 256;
constexpr std::uint32_t kSet = 1;
constexpr std::uint32_t kQuery = 0;
constexpr std::uint32_t kObjectHeader = 0x00100180;
constexpr std::uint32_t kChannelBuffer = 2056;

// Notifications.
constexpr std::uint32_t kSpectralSignature = 0x06C45E00;
constexpr std::uint32_t kMagic = 23602;
constexpr std::uint32_t kSamples = 1;
constexpr std::uint32_t kCompleted = 2;
constexpr std::size_t kMessageHeaderSize = 16;
constexpr std::size_t kRecordsAt = 18;
constexpr std::size_t kRecordSize = 236;
constexpr std::size_t kBinsAt = 56;
constexpr std::size_t kPowerAt = 7;

bool hasHeader(std::span<const std::uint8_t> request, std::uint32_t method, std::uint32_t code,
               std::size_t size) {
    return request.size() == size && loadU32(request, kMethodAt) == method &&
           loadU32(request, kControlCodeAt) == code &&
           loadU32(request, kSpectralLengthAt) == size - kSpectralHeaderSize;
}

Bytes message(std::uint32_t subtype, std::size_t size) {
    Bytes block(size);
    storeU32(block, 0, kSpectralSignature);
    storeU32(block, 8, subtype);
    storeU32(block, 12, kMagic);
    return block;
}

void storeRecord(std::span<std::uint8_t> block, const ScanRecord& record) {
    storeU16(block, 0, record.frequency);
    storeU16(block, 2, record.congestion);
    storeU16(block, kPowerAt, static_cast<std::uint16_t>(record.power));
    std::copy(record.bins.begin(), record.bins.end(), block.subspan(kBinsAt).begin());
}

}  // namespace

std::optional<bool> readScanControl(std::span<const std::uint8_t> request) {
    if (!hasHeader(request, kSet, kScanControlCode, kScanControlSize)) return std::nullopt;
    const std::uint32_t enable = loadU32(request, kEnableAt);
    if (enable > 1) return std::nullopt;
    return enable == 1;
}

bool isChannelListRequest(std::span<const std::uint8_t> request) {
    return hasHeader(request, kQuery, kChannelListCode, kChannelListSize) &&
           loadU32(request, kObjectHeaderAt) == kObjectHeader &&
           loadU32(request, kBufferSizeAt) == kChannelBuffer &&
           loadU32(request, kBufferSizeAgainAt) == kChannelBuffer;
}

Bytes channelListAnswer(std::span<const std::uint8_t> request, const std::vector<int>& channels) {
    Bytes answer(request.begin(), request.end());
    storeU32(answer, kCountAt, static_cast<std::uint32_t>(channels.size()));
    for (std::size_t i = 0; i < std::min(channels.size(), kMaxChannels); ++i) {
        answer[kFirstChannelAt + i * kChannelEntrySize] = static_cast<std::uint8_t>(channels[i]);
    }
    return answer;
}

Bytes samplesMessage(std::span<const ScanRecord> records) {
    Bytes block = message(kSamples, kRecordsAt + records.size() * kRecordSize);
    storeU16(block, kMessageHeaderSize, static_cast<std::uint16_t>(records.size()));
    for (std::size_t i = 0; i < records.size(); ++i) {
        storeRecord(std::span(block).subspan(kRecordsAt + i * kRecordSize, kRecordSize), records[i]);
    }
    return block;
}

Bytes scanCompletedMessage() {
    return message(kCompleted, kMessageHeaderSize);
}

}  // namespace vexa::simulation
