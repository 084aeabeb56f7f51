#include <new>
#include <utility>

#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"
#include "text/OutOfMemory.h"

namespace vexa {

namespace {

using platform::LockGuard;

constexpr std::size_t kRealmLengthSize = 4;

}  // namespace

ResultCode Supplicant::sendIhvCmd() try {
    const DWORD result = m_wlan.tellModule(ihvRequest(IhvRequest::QueryAnqp));
    if (result == ERROR_SUCCESS) return kSuccess;
    Log(3, "WlanIhvControl call failed in sendIhvCmd with result code=%d", static_cast<int>(result));
    return kFailure;
} catch (const std::bad_alloc&) {
    return kFailure;
}

ResultCode Supplicant::getHs20BssListFromIHV() {
    const LockGuard lock(g_hs20Lock);
    Log(3, "Get HS20 BSS list from IHV.");
    std::vector<std::byte> request;
    if (!withinMemory([&] { request = ihvRequest(IhvRequest::GetBssList); })) {
        Log(3, "PrivateMemoryAlloc failed.");
        return kFailure;
    }
    std::vector<std::byte> reply;
    if (!withinMemory([&] { reply.reserve(kIhvReplySize); })) {
        Log(3, "PrivateMemoryAlloc failed for out buffer.");
        return kSuccess;
    }
    const DWORD result = m_wlan.askModule(std::move(request), reply);
    if (result != ERROR_SUCCESS) {
        Log(3, "WlanIhvControl failed with error code=%d", static_cast<int>(result));
        return kFailure;
    }
    if (reply.empty()) {
        Log(3, "dwBytesWritten equals 0.");
        return kSuccess;
    }
    const auto records = parseBssRecords(reply);
    Log(3, "Get %d HS20 networks from IHV", static_cast<int>(records.size()));
    if (updateHs20NetworkList(records) == kSuccess) return kSuccess;
    Log(6, "ERROR: Update HS20 network list failed.");
    return kFailure;
}

ResultCode Supplicant::fetchBssAnqpInfo(Hs20Network& network) try {
    Log(3, "Fetching BSS with ssid=%s and mac address=%s  ANQP info from HS20 IHV...",
        network.ssidText().c_str(), toText(network.m_macAddress).c_str());
    std::vector<std::byte> reply;
    if (m_wlan.askModule(ihvRequest(IhvRequest::GetAnqpInfo, network.record()), reply) != ERROR_SUCCESS) {
        Log(3, "WlanIhvControl call failed.");
        return kFailure;
    }
    LogBytes(3, "ANQP info fetched from IHV: ", reply.data(), static_cast<std::int64_t>(reply.size()), true);
    if (reply.empty()) return kSuccess;
    if (reply.size() < kRealmLengthSize) {
        Log(6, "ERROR: Output buffer overflow in fetchBssAnqpInfo:No room for realm size field.");
        return kFailure;
    }
    const std::size_t realmLength = readLittleEndian<std::uint32_t>(reply, 0);
    if (realmLength > reply.size() - kRealmLengthSize) {
        Log(6, "ERROR: Output buffer overflow in fetchBssAnqpInfo.No room for realm name");
        return kFailure;
    }
    if (realmLength == 0) {
        Log(3, "No ANQP NAI realm info.");
        return kSuccess;
    }
    network.takeRealmList(Bytes(reply).subspan(kRealmLengthSize, realmLength));
    return kSuccess;
} catch (const std::bad_alloc&) {
    return kFailure;
}

ResultCode Supplicant::queryHs20NetworkAnqpInfo() {
    Log(3, "SIGMA: Enter Supplicant::queryHs20NetworkAnqpInfo.");
    m_engine.m_bQueryingAnqp = true;
    if (sendIhvCmd() != kSuccess) {
        m_engine.m_bQueryingAnqp = false;
        return kFailure;
    }
    Log(3, "Supplicant::queryHs20NetworkAnqpInfo completed.");
    return kSuccess;
}

}  // namespace vexa
