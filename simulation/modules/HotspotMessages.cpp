#include "simulation/modules/HotspotMessages.h"

#include <algorithm>

#include "simulation/text/Wire.h"

namespace vexa::simulation {

namespace {

constexpr std::size_t kHeaderSize = 16;
constexpr std::size_t kReservedAt = 4;
constexpr std::size_t kSubtypeAt = 8;
constexpr std::size_t kHotspotLengthAt = 12;
constexpr std::size_t kPlainRequestSize = 20;
constexpr std::size_t kBssidSize = 6;

constexpr std::size_t kSsidAt = 6;
constexpr std::size_t kIsHs20At = 40;
constexpr std::size_t kNetworkTypeAt = 44;
constexpr std::size_t kInternetAccessAt = 48;

void appendU16(Bytes& out, std::size_t value) {
    out.resize(out.size() + 2);
    storeU16(out, out.size() - 2, static_cast<std::uint16_t>(value));
}

void appendByte(Bytes& out, std::size_t value) {
    out.push_back(static_cast<std::uint8_t>(value));
}

// One NAI Realm Data entry behind its length: its methods come without authentication parameters.
void appendRealmData(Bytes& list, const NetworkRealm& realm) {
    const std::string names = joinedNames(realm);
    appendU16(list, 3 + names.size() + 3 * realm.eapMethods.size());
    appendByte(list, 0);  // the encoding: names as in a network access identifier
    appendByte(list, names.size());
    list.insert(list.end(), names.begin(), names.end());
    appendByte(list, realm.eapMethods.size());
    for (const std::uint8_t method : realm.eapMethods)
        list.insert(list.end(), {2, method, 0});
}

Bytes realmList(const std::vector<NetworkRealm>& realms) {
    Bytes list;
    appendU16(list, realms.size());
    for (const NetworkRealm& realm : realms)
        appendRealmData(list, realm);
    return list;
}

}  // namespace

bool isHotspotRequest(IhvRequest kind, std::span<const std::uint8_t> request) {
    const bool hasRecord = kind == IhvRequest::AnqpInfo;
    const std::size_t size = hasRecord ? kHeaderSize + kBssRecordSize : kPlainRequestSize;
    const std::size_t payload = hasRecord ? kBssRecordSize : 0;
    return request.size() == size && loadU32(request, kReservedAt) == 0 &&
           loadU32(request, kHotspotLengthAt) == payload;
}

std::span<const std::uint8_t> bssidOfRequest(std::span<const std::uint8_t> request) {
    return request.subspan(kHeaderSize, kBssidSize);
}

Bytes bssRecord(const Network& network) {
    Bytes record = bssRecordOfSsid(network.ssid);
    std::copy(network.bssid.begin(), network.bssid.end(), record.begin());
    setIsHs20(record, network.hs20 ? 1 : 0);
    storeU32(record, kNetworkTypeAt, network.networkType);
    storeU32(record, kInternetAccessAt, network.internetAccess);
    return record;
}

Bytes bssRecordOfSsid(std::span<const std::uint8_t> ssid) {
    Bytes record(kBssRecordSize);
    std::copy(ssid.begin(), ssid.end(), record.begin() + kSsidAt);
    return record;
}

void setIsHs20(std::span<std::uint8_t> record, std::uint32_t value) {
    storeU32(record, kIsHs20At, value);
}

Bytes bssRecords(const std::vector<std::shared_ptr<const Network>>& networks) {
    Bytes records;
    records.reserve(networks.size() * kBssRecordSize);
    for (const auto& network : networks) {
        const Bytes record = bssRecord(*network);
        records.insert(records.end(), record.begin(), record.end());
    }
    return records;
}

Bytes anqpInfo(const Network& network) {
    const Bytes list = network.realms ? realmList(*network.realms) : network.naiRealmList.value_or(Bytes{});
    Bytes info(sizeof(std::uint32_t));
    storeU32(info, 0, static_cast<std::uint32_t>(list.size()));
    info.insert(info.end(), list.begin(), list.end());
    return info;
}

Bytes hotspotMessage(HotspotEvent event, const Bytes& payload) {
    Bytes message(kHeaderSize);
    storeU32(message, 0, kHotspotSignature);
    storeU32(message, kSubtypeAt, static_cast<std::uint32_t>(event));
    storeU32(message, kHotspotLengthAt, static_cast<std::uint32_t>(payload.size()));
    message.insert(message.end(), payload.begin(), payload.end());
    return message;
}

Bytes hotspotMessage(HotspotEvent event, std::uint32_t first, std::uint32_t second) {
    Bytes payload(2 * sizeof(std::uint32_t));
    storeU32(payload, 0, first);
    storeU32(payload, sizeof first, second);
    return hotspotMessage(event, payload);
}

}  // namespace vexa::simulation
