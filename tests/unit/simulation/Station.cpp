#include "Station.h"

#include <gtest/gtest.h>

#include <array>
#include <cstring>

namespace vexa::simulation {

namespace {

constexpr std::size_t kReasonAt = 560;

std::string profile(const std::string& name, const std::string& ssidHex, const std::string& authMode,
                    const std::string& eap) {
    return "<?xml version=\"1.0\"?><WLANProfile xmlns=\"urn:profile\"> \t<name>" + name +
           "</name>\t<SSIDConfig>\t\t<SSID>\t\t\t<hex>" + ssidHex + "</hex>\t\t\t<name>" + name +
           "</name>\t\t</SSID>\t</SSIDConfig>\t<MSM>\t\t<security> \t\t\t<OneX xmlns=\"urn:onex\"> "
           "\t\t\t\t<authMode>" +
           authMode +
           "</authMode>\t\t\t\t<EAPConfig><EapHostConfig xmlns=\"urn:eap\">\t<EapMethod>\t\t<Type>" + eap +
           "</Config></EapHostConfig></EAPConfig> \t\t\t</OneX> \t\t</security> \t</MSM> </WLANProfile>";
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

}  // namespace

std::string ttlsProfile(const std::string& name, const std::string& ssidHex, const std::string& username,
                        const std::string& password) {
    return profile(
        name, ssidHex, "machineOrUser",
        "21</Type>\t</EapMethod>\t<Config>\t\t<ConnData>\t\t\t<username>" + username +
            "</username>\t\t\t<password>" + password +
            "</password>\t\t\t<domain></domain>\t\t\t<identity>anonymous</identity>\t\t</ConnData>\t");
}

std::string tlsProfile(const std::string& name, const std::string& ssidHex, const std::string& caCert,
                       const std::string& authMode) {
    return profile(name, ssidHex, authMode,
                   "13</Type>\t</EapMethod>\t<Config>\t\t<Eap>\t\t\t<Type>13</Type>\t\t\t<EapType>"
                   "\t\t\t\t<ServerValidation>\t\t\t\t\t<TrustedRootCA>" +
                       caCert + "</TrustedRootCA>\t\t\t\t</ServerValidation>\t\t\t</EapType>\t\t</Eap>\t");
}

Station::Station(const std::string& scenario) : machine(scenario) {
    listener.onNotification = [this](const WLAN_NOTIFICATION_DATA& data) {
        m_told.push_back(std::to_string(data.NotificationSource) + "/" +
                         std::to_string(data.NotificationCode) + " " + stateAndChannel(*this) +
                         reasonOf(data));
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
    const GUID guid = machine.guid();
    return WlanConnect(listener.handle(), &guid, &parameters, nullptr);
}

DWORD Station::disconnect() {
    const GUID guid = machine.guid();
    return WlanDisconnect(listener.handle(), &guid, nullptr);
}

DWORD Station::query(WLAN_INTF_OPCODE opcode, Bytes& answer) {
    const GUID guid = machine.guid();
    DWORD size = 0;
    PVOID data = nullptr;
    const DWORD result = WlanQueryInterface(listener.handle(), &guid, opcode, nullptr, &size, &data, nullptr);
    const auto* const bytes = static_cast<const std::uint8_t*>(data);
    if (bytes) answer.assign(bytes, bytes + size);
    WlanFreeMemory(data);
    return result;
}

void Station::join(const std::string& ssidHex) {
    ASSERT_EQ(connect(ttlsProfile("name", ssidHex, "u", "p")), ERROR_SUCCESS);
    machine.advance(200);
    ASSERT_EQ(state(), "connected");
    told();
}

std::vector<std::string> Station::told() {
    machine.advance(0);
    return std::exchange(m_told, {});
}

void Station::perform(const std::string& action) {
    EXPECT_EQ(machine.ask(action), R"({"ok":true})") << action;
}

std::string Station::state() {
    return machine.query("{'query': 'interface'}")["state"].asString();
}

Told operator+(Told first, const Told& second) {
    first.insert(first.end(), second.begin(), second.end());
    return first;
}

}  // namespace vexa::simulation
