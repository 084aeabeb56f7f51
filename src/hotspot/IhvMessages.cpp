#include "hotspot/IhvMessages.h"

#include <algorithm>
#include <string_view>

namespace vexa {

namespace {

constexpr std::size_t kSubtypeOffset = 8;
constexpr std::size_t kLengthOffset = 12;
constexpr std::size_t kPlainRequestSize = 20;

constexpr std::size_t kMacOffset = 0;
constexpr std::size_t kSsidOffset = 6;
constexpr std::size_t kIsHs20Offset = 40;
constexpr std::size_t kNetworkTypeOffset = 44;
constexpr std::size_t kInternetAccessOffset = 48;

std::vector<std::byte> message(IhvRequest subtype, std::size_t size, std::size_t payloadLength) {
    std::vector<std::byte> bytes(size);
    writeLittleEndian(bytes, 0, HS20_MODULE_SIGNATURE);
    writeLittleEndian(bytes, kSubtypeOffset, static_cast<std::uint32_t>(subtype));
    writeLittleEndian(bytes, kLengthOffset, static_cast<std::uint32_t>(payloadLength));
    return bytes;
}

}  // namespace

std::string toText(const MacAddress& mac) {
    constexpr std::string_view kDigits = "0123456789abcdef";
    std::string text;
    for (const std::uint8_t octet : mac) {
        if (!text.empty()) text += ':';
        text.append({kDigits[octet >> 4], kDigits[octet & 15]});
    }
    return text;
}

std::uint32_t numberAt(Bytes payload, std::size_t offset) {
    return payload.size() < offset + 4 ? 0 : readLittleEndian<std::uint32_t>(payload, offset);
}

Hs20BssRecord parseBssRecord(Bytes bytes) {
    std::array<std::byte, kBssRecordSize> whole{};
    std::copy_n(bytes.begin(), std::min(bytes.size(), whole.size()), whole.begin());
    Hs20BssRecord record;
    for (std::size_t i = 0; i < record.macAddress.size(); ++i)
        record.macAddress[i] = std::to_integer<std::uint8_t>(whole[kMacOffset + i]);
    for (std::size_t i = 0; kSsidOffset + i < kIsHs20Offset && whole[kSsidOffset + i] != std::byte{0}; ++i)
        record.ssid += std::to_integer<char>(whole[kSsidOffset + i]);
    record.isHs20 = numberAt(whole, kIsHs20Offset);
    record.networkType = numberAt(whole, kNetworkTypeOffset);
    record.internetAccess = numberAt(whole, kInternetAccessOffset);
    return record;
}

std::vector<Hs20BssRecord> parseBssRecords(Bytes bytes, std::size_t limit) {
    std::vector<Hs20BssRecord> records(std::min(bytes.size() / kBssRecordSize, limit));
    for (std::size_t i = 0; i < records.size(); ++i)
        records[i] = parseBssRecord(bytes.subspan(i * kBssRecordSize, kBssRecordSize));
    return records;
}

std::vector<std::byte> ihvRequest(IhvRequest subtype) {
    return message(subtype, kPlainRequestSize, 0);
}

std::vector<std::byte> ihvRequest(IhvRequest subtype, const Hs20BssRecord& record) {
    auto bytes = message(subtype, kIhvHeaderSize + kBssRecordSize, kBssRecordSize);
    const std::span<std::byte> payload = std::span(bytes).subspan(kIhvHeaderSize);
    std::transform(record.macAddress.begin(), record.macAddress.end(), payload.begin() + kMacOffset,
                   [](std::uint8_t octet) { return std::byte{octet}; });
    std::transform(
        record.ssid.begin(),
        record.ssid.begin() + static_cast<std::ptrdiff_t>(std::min(record.ssid.size(), kMaxSsidLength)),
        payload.begin() + kSsidOffset, [](char c) { return static_cast<std::byte>(c); });
    writeLittleEndian(payload, kIsHs20Offset, record.isHs20);
    writeLittleEndian(payload, kNetworkTypeOffset, record.networkType);
    writeLittleEndian(payload, kInternetAccessOffset, record.internetAccess);
    return bytes;
}

IhvMessage parseIhvMessage(Bytes block) {
    const Bytes behind = block.subspan(kIhvHeaderSize);
    const std::size_t claimed = numberAt(block, kLengthOffset);
    return {static_cast<IhvNotification>(numberAt(block, kSubtypeOffset)),
            behind.first(std::min(claimed, behind.size())), behind};
}

}  // namespace vexa
