#include "connection/ConnectionHistory.h"

#include <cstring>
#include <string>

#include "base/DiagnosticLog.h"
#include "hotspot/Hs20NetworkList.h"

namespace vexa {

namespace {

std::string textOf(const DOT11_SSID& ssid) {
    return std::string(bytesOf(ssid));
}

void close(ConnectionRecord& record) {
    record.m_disconnectedTime = getTimeValue();
    record.m_bDisconnectedTimeValid = true;
}

}  // namespace

ResultCode ConnectionHistory::addConnection(const DOT11_SSID& ssid, const MacAddress& mac,
                                            const Hs20NetworkList& networks) {
    if (networks.findBySsid(bytesOf(ssid)) == nullptr) {
        Log(3, "Not a HS20 network, don't adding history.");
        return kSuccess;
    }
    if (m_records.size() >= CONNECTION_HISTORY_CAPACITY) {
        Log(5, "Connection history entries overflow, clear all entries.");
        m_records.clear();
    }
    if (!m_records.empty() && !m_records.back().m_bDisconnectedTimeValid) {
        Log(6, "Disconnected time not specified for last connection, ssid=%s",
            textOf(m_records.back().m_ssid).c_str());
        close(m_records.back());
    }
    ConnectionRecord record;
    record.m_connectedTime = getTimeValue();
    record.m_macAddress = mac;
    record.m_ssid = ssid;
    m_records.push_back(record);
    dump();
    return kSuccess;
}

ResultCode ConnectionHistory::updateDisconnection(const DOT11_SSID& ssid, const Hs20NetworkList& networks) {
    if (networks.findBySsid(bytesOf(ssid)) == nullptr) {
        Log(3, "Not a HS20 network, don't update history.");
        return kSuccess;
    }
    if (m_records.empty()) {
        Log(6, "No connection history info while we disconnected from a network.");
        return kSuccess;
    }
    if (std::memcmp(&m_records.back().m_ssid, &ssid, sizeof ssid) != 0) {
        Log(6, "ERROR: The ssid is not equal, last connection ssid=%s while disconnected ssid=%s",
            textOf(m_records.back().m_ssid).c_str(), textOf(ssid).c_str());
        return kFailure;
    }
    close(m_records.back());
    dump();
    return kSuccess;
}

const ConnectionRecord* ConnectionHistory::last() const {
    return m_records.empty() ? nullptr : &m_records.back();
}

// For a debugger's reader: the level is never written, so the lines are only made for a log that is on.
void ConnectionHistory::dump() const {
    if (!DiagnosticLog::instance().isEnabled()) return;
    Log(0, "Dump all connection history, with the most recent connection first:");
    if (m_records.empty()) Log(0, "\tNo connection history.");
    for (std::size_t i = m_records.size(); i-- > 0;) {
        const ConnectionRecord& record = m_records[i];
        Log(0, "\t[%d] Ssid=%s MacAddr=%s connected time=%s, disconnected time=%s", static_cast<int>(i),
            textOf(record.m_ssid).c_str(), toText(record.m_macAddress).c_str(),
            formatTimeValue(record.m_connectedTime).c_str(),
            record.m_bDisconnectedTimeValid ? formatTimeValue(record.m_disconnectedTime).c_str()
                                            : "not specified");
    }
}

}  // namespace vexa
