#include "Station.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstring>

namespace vexa::simulation {

namespace {

constexpr std::size_t kReasonAt = 560;

std::string profile(const std::string& name, const std::string& ssidHex, const std::string& authMode,
                    const std::string& method, const std::string& config) {
    return "<WLANProfile xmlns=\"urn:profile\"><name>" + name + "</name>\t<SSIDConfig><SSID><hex>" + ssidHex +
           "</hex></SSID></SSIDConfig><MSM><security>\t<OneX><authMode>" + authMode +
           "</authMode> <EAPConfig><EapHostConfig><EapMethod><Type>" + method +
           "</Type></EapMethod><Config>" + config +
           "</Config></EapHostConfig></EAPConfig></OneX></security></MSM></WLANProfile>";
}

std::string stateAndChannel(Station& station) {
    static constexpr std::array<const char*, 8> kNames = {
        "not_ready",    "connected",   "ad_hoc_network_formed", "disconnecting",
        "disconnected", "associating", "discovering",           "authenticating"};
    Bytes state;
    Bytes channel;
    if (station.query(wlan_intf_opcode_interface_state, state) != ERROR_SUCCESS ||
        station.query(wlan_intf_opcode_channel_number, channel) != ERROR_SUCCESS) {
        return "gone";
    }
    return std::string(kNames.at(state.at(0))) + " " + std::to_string(channel.at(0));
}

std::string reasonOf(const WLAN_NOTIFICATION_DATA& data) {
    if (data.dwDataSize != sizeof(WLAN_CONNECTION_NOTIFICATION_DATA)) return {};
    DWORD reason = 0;
    std::memcpy(&reason, static_cast<const std::uint8_t*>(data.pData) + kReasonAt, sizeof reason);
    char text[16];
    std::snprintf(text, sizeof text, " %08x", reason);
    return reason == 0 ? std::string() : text;
}

std::string codeOf(DWORD source, DWORD code) {
    return std::to_string(source) + "/" + std::to_string(code);
}

}  // namespace

Texts operator+(Texts first, const Texts& second) {
    first.insert(first.end(), second.begin(), second.end());
    return first;
}

std::string hex(std::string spaced) {
    std::erase(spaced, ' ');
    return spaced;
}

std::string zeros(std::size_t bytes) {
    return std::string(bytes * 2, '0');
}

std::string at(const Bytes& block, std::size_t offset, std::size_t size) {
    return hexText(std::span(block).subspan(offset, size));
}

std::string ttlsProfile(const std::string& name, const std::string& ssidHex, const std::string& username,
                        const std::string& password) {
    return profile(name, ssidHex, "machineOrUser", "21",
                   "<ConnData><username>" + username + "</username><password>" + password +
                       "</password><domain></domain></ConnData>");
}

std::string tlsProfile(const std::string& name, const std::string& ssidHex, const std::string& caCert,
                       const std::string& authMode) {
    return profile(name, ssidHex, authMode, "13",
                   "<Eap><Type>13</Type><EapType><ServerValidation><TrustedRootCA>" + caCert +
                       "</TrustedRootCA></ServerValidation></EapType></Eap>");
}

Listener::Listener() {
    DWORD version = 0;
    EXPECT_EQ(WlanOpenHandle(2, nullptr, &version, &m_handle), ERROR_SUCCESS);
    EXPECT_EQ(version, 2U);
    EXPECT_EQ(WlanRegisterNotification(m_handle, WLAN_NOTIFICATION_SOURCE_ALL, FALSE, callback, this, nullptr,
                                       nullptr),
              ERROR_SUCCESS);
}

Listener::~Listener() {
    WlanCloseHandle(m_handle, nullptr);
}

std::vector<Heard> Listener::heard() {
    const platform::LockGuard<platform::Mutex> lock(m_mutex);
    return m_heard;
}

std::string Listener::codes() {
    std::string text;
    for (const Heard& one : heard())
        text += (text.empty() ? "" : " ") + codeOf(one.source, one.code);
    return text;
}

void Listener::callback(PWLAN_NOTIFICATION_DATA data, PVOID context) {
    auto& self = *static_cast<Listener*>(context);
    if (self.onNotification) self.onNotification(*data);
    const auto* bytes = static_cast<const std::uint8_t*>(data->pData);
    const platform::LockGuard<platform::Mutex> lock(self.m_mutex);
    self.m_heard.push_back({data->NotificationSource, data->NotificationCode, data->InterfaceGuid,
                            bytes ? Bytes(bytes, bytes + data->dwDataSize) : Bytes{}});
}

Station::Station(const std::string& scenario)
    : machine(scenario), guid(machine->adapters().count() > 0 ? machine->adapters().guid(0) : GUID{}) {
    listener.onNotification = [this](const WLAN_NOTIFICATION_DATA& data) {
        m_told.push_back(codeOf(data.NotificationSource, data.NotificationCode) + " " +
                         stateAndChannel(*this) + reasonOf(data));
    };
}

DWORD Station::connect(const std::string& profile) {
    const std::u16string text = utf16(profile);
    return connect({wlan_connection_mode_temporary_profile, text.c_str(), nullptr, nullptr,
                    dot11_BSS_type_infrastructure, 1});
}

DWORD Station::discover(const std::string& ssid) {
    DOT11_SSID field{};
    field.uSSIDLength = static_cast<ULONG>(ssid.size());
    std::memcpy(field.ucSSID, ssid.data(), std::min<std::size_t>(ssid.size(), sizeof field.ucSSID));
    return connect(
        {wlan_connection_mode_discovery_secure, nullptr, &field, nullptr, dot11_BSS_type_infrastructure, 1});
}

DWORD Station::connect(WLAN_CONNECTION_PARAMETERS parameters) {
    return WlanConnect(listener.handle(), &guid, &parameters, nullptr);
}

DWORD Station::disconnect() {
    return WlanDisconnect(listener.handle(), &guid, nullptr);
}

DWORD Station::query(WLAN_INTF_OPCODE opcode, Bytes& answer) {
    DWORD size = 0;
    PVOID data = nullptr;
    const DWORD result = WlanQueryInterface(listener.handle(), &guid, opcode, nullptr, &size, &data, nullptr);
    const auto* const bytes = static_cast<const std::uint8_t*>(data);
    answer.assign(bytes, bytes + size);
    WlanFreeMemory(data);
    return result;
}

DWORD Station::control(WLAN_IHV_CONTROL_TYPE type, Bytes request, DWORD capacity) {
    constexpr std::uint8_t kUntouched = 0xEE;
    output.assign(capacity, kUntouched);
    DWORD returned = 0;
    const DWORD result = WlanIhvControl(listener.handle(), &guid, type, static_cast<DWORD>(request.size()),
                                        request.data(), capacity, output.data(), &returned);
    EXPECT_EQ(std::count(output.begin() + returned, output.end(), kUntouched), capacity - returned);
    output.resize(returned);
    return result;
}

void Station::act(const std::string& what) {
    const std::string name = what.substr(what.find(' ') + 1);
    if (what.starts_with('{')) return machine.perform(what);
    if (what.starts_with("connect")) {
        EXPECT_EQ(connect(ttlsProfile(name, hexText(Bytes(name.begin(), name.end())))), ERROR_SUCCESS);
    } else {
        EXPECT_EQ(what == "disconnect" ? disconnect() : discover(name), ERROR_SUCCESS);
    }
}

Texts Station::told() {
    machine.advance(0);
    return std::exchange(m_told, {});
}

Texts Station::blocks() {
    Texts blocks;
    const auto heard = listener.heard();
    for (; m_seenBlocks < heard.size(); ++m_seenBlocks) {
        const Heard& one = heard[m_seenBlocks];
        if (codeOf(one.source, one.code) == "64/0") blocks.push_back(hexText(one.data));
    }
    return blocks;
}

std::string Station::state() {
    return machine.query("{'query': 'interface'}")["state"].asString();
}

}  // namespace vexa::simulation
