#include <gtest/gtest.h>

#include "Station.h"
#include "simulation/JsonText.h"

namespace vexa::simulation {
namespace {

const std::string kScenario =
    "{'networks': [{'bssid': '02:00:00:00:00:01', 'ssidHex': '43e9', 'channel': 11, 'accepts': "
    "[{'eapMethod': 21}]}]}";

std::string profileWith(const std::string& part, const std::string& replacement) {
    std::string profile = ttlsProfile("C\xC3\xA9", "43E9", "u", "p");
    return profile.replace(profile.find(part), part.size(), replacement);
}

std::string at(const Bytes& bytes, std::size_t offset, std::size_t size) {
    return hexText(std::span(bytes).subspan(offset, size));
}

TEST(ConnectionCalls, AProfileThatCanNotBeUsedIsRefused) {
    Station station(kScenario);
    const std::string profiles[] = {
        "",
        "no profile",
        profileWith(">u<", ">u & v<"),
        profileWith(">p<", ">p<p<"),
        profileWith("</WLANProfile>", ""),
        profileWith("<hex>43E9</hex>", ""),
        profileWith("43E9", ""),
        profileWith("43E9", "43E"),
        profileWith("43E9", std::string(66, '4')),
        profileWith("EAPConfig", "EapConfig"),
        "<WLANProfile><SSIDConfig><SSID><hex>43E9</hex></SSID></SSIDConfig></WLANProfile>",
        "<Other/>",
    };
    for (const std::string& profile : profiles)
        EXPECT_EQ(station.connect(profile), ERROR_BAD_PROFILE) << profile;
    EXPECT_EQ(station.told(), Told{});
    EXPECT_EQ(station.connect(profileWith("u", "u")), ERROR_SUCCESS);
}

TEST(ConnectionCalls, ARefusedRequestLeavesTheConnectionAlone) {
    Station station(kScenario);
    station.join("43e9");
    EXPECT_EQ(station.connect("no profile"), ERROR_BAD_PROFILE);
    EXPECT_EQ(station.told(), Told{});
    EXPECT_EQ(station.state(), "connected");
}

TEST(ConnectionCalls, ParametersThatMakeNoSenseAreRefused) {
    Station station(kScenario);
    DOT11_SSID tooLong{33, {}};
    DOT11_SSID good{1, {'a'}};
    const struct {
        WLAN_CONNECTION_MODE mode;
        DOT11_SSID* ssid;
    } cases[] = {
        {wlan_connection_mode_temporary_profile, nullptr},
        {wlan_connection_mode_temporary_profile, &good},
        {wlan_connection_mode_discovery_secure, nullptr},
        {wlan_connection_mode_discovery_secure, &tooLong},
        {wlan_connection_mode_profile, &good},
        {wlan_connection_mode_auto, &good},
    };
    for (const auto& [mode, ssid] : cases) {
        EXPECT_EQ(station.connect({mode, nullptr, ssid, nullptr, dot11_BSS_type_infrastructure, 0}),
                  ERROR_INVALID_PARAMETER)
            << mode;
    }
    EXPECT_EQ(station.discover(""), ERROR_INVALID_PARAMETER);
    const GUID guid = station.machine.guid();
    EXPECT_EQ(WlanConnect(station.listener.handle(), &guid, nullptr, nullptr), ERROR_INVALID_PARAMETER);
    EXPECT_EQ(station.told(), Told{});
}

TEST(ConnectionCalls, HandlesAdaptersAndRadiosAreChecked) {
    Station station("{'adapters': [{}, {}, {'inserted': false}]}");
    const std::u16string text = utf16(ttlsProfile("a", "61", "u", "p"));
    WLAN_CONNECTION_PARAMETERS parameters{wlan_connection_mode_temporary_profile,
                                          text.c_str(),
                                          nullptr,
                                          nullptr,
                                          dot11_BSS_type_infrastructure,
                                          0};
    const auto connectOn = [&](HANDLE handle, std::size_t adapter) {
        const GUID guid = station.machine->adapters().guid(adapter);
        return WlanConnect(handle, &guid, &parameters, nullptr);
    };
    const auto disconnectOn = [&](HANDLE handle, std::size_t adapter) {
        const GUID guid = station.machine->adapters().guid(adapter);
        return WlanDisconnect(handle, &guid, nullptr);
    };
    const HANDLE open = station.listener.handle();
    EXPECT_EQ(connectOn(nullptr, 0), ERROR_INVALID_HANDLE);
    EXPECT_EQ(disconnectOn(nullptr, 0), ERROR_INVALID_HANDLE);
    EXPECT_EQ(connectOn(open, 2), ERROR_NOT_FOUND);
    EXPECT_EQ(disconnectOn(open, 2), ERROR_NOT_FOUND);
    EXPECT_EQ(connectOn(open, 1), ERROR_INVALID_STATE);
    EXPECT_EQ(disconnectOn(open, 1), ERROR_SUCCESS);
    for (const char* radio : {"hardware", "software"}) {
        station.perform("{'do': 'radio', '" + std::string(radio) + "': 'off'}");
        EXPECT_EQ(connectOn(open, 0), ERROR_INVALID_STATE);
        station.perform("{'do': 'radio', '" + std::string(radio) + "': 'unknown'}");
    }
    EXPECT_EQ(connectOn(open, 0), ERROR_SUCCESS);
}

TEST(ConnectionCalls, ConnectionNotificationsCarryTheirProfileAndNetwork) {
    Station station(kScenario);
    station.connect(profileWith("u", "u"));
    station.machine.advance(200);
    const auto heard = station.listener.heard();
    ASSERT_EQ(station.listener.codes(), "8/9 16/1 16/2 16/3 16/4 8/10");
    for (const std::size_t acm : {0U, 5U}) {
        const Bytes& data = heard[acm].data;
        ASSERT_EQ(data.size(), 572U);
        EXPECT_EQ(at(data, 0, 12),
                  "01000000"
                  "4300e90000000000");
        EXPECT_EQ(at(data, 516, 8),
                  "02000000"
                  "43e90000");
        EXPECT_EQ(at(data, 552, 20),
                  "01000000"
                  "01000000"
                  "00000000"
                  "00000000"
                  "00000000");
    }
    for (const std::size_t msm : {1U, 2U, 3U, 4U})
        EXPECT_TRUE(heard[msm].data.empty());
}

TEST(ConnectionCalls, AProfileNamedByItsSsidIsTheSsidWidened) {
    Station station(kScenario);
    station.discover("C\xE9");
    station.machine.advance(200);
    const Bytes data = station.listener.heard().at(0).data;
    EXPECT_EQ(at(data, 0, 12),
              "02000000"
              "4300e90000000000");
    EXPECT_EQ(at(data, 516, 8),
              "02000000"
              "43e90000");
}

TEST(ConnectionCalls, ALongProfileNameIsCut) {
    Station station(kScenario);
    station.connect(ttlsProfile(std::string(300, 'x'), "43e9", "u", "p"));
    station.told();
    const Bytes data = station.listener.heard().at(0).data;
    EXPECT_EQ(at(data, 4 + 2 * 254, 4), "78000000");
    EXPECT_EQ(at(data, 516, 4), "02000000");
}

TEST(ConnectionCalls, TheCurrentConnectionIsAnsweredWhileThereIsOne) {
    Station station(kScenario);
    Bytes answer;
    EXPECT_EQ(station.query(wlan_intf_opcode_current_connection, answer), ERROR_INVALID_STATE);
    station.connect(profileWith("u", "u"));
    ASSERT_EQ(station.query(wlan_intf_opcode_current_connection, answer), ERROR_SUCCESS);
    EXPECT_EQ(at(answer, 0, 4), "05000000");
    station.machine.advance(200);
    ASSERT_EQ(station.query(wlan_intf_opcode_current_connection, answer), ERROR_SUCCESS);
    ASSERT_EQ(answer.size(), 604U);
    EXPECT_EQ(at(answer, 0, 16),
              "01000000"
              "01000000"
              "4300e90000000000");
    EXPECT_EQ(at(answer, 520, 8),
              "02000000"
              "43e90000");
    EXPECT_EQ(at(answer, 556, 12),
              "01000000"
              "020000000001"
              "0000");
    EXPECT_EQ(at(answer, 588, 16),
              "01000000"
              "01000000"
              "06000000"
              "04000000");
    station.perform("{'do': 'interfaceState', 'value': 3}");
    ASSERT_EQ(station.query(wlan_intf_opcode_current_connection, answer), ERROR_SUCCESS);
    EXPECT_EQ(at(answer, 0, 4), "03000000");
    station.disconnect();
    station.told();
    EXPECT_EQ(station.query(wlan_intf_opcode_current_connection, answer), ERROR_INVALID_STATE);
}

TEST(ConnectionCalls, TheInterfaceQueryTellsTheSsid) {
    Station station(kScenario);
    const auto ssid = [&] { return compactJson(station.machine.query("{'query': 'interface'}")["ssid"]); };
    EXPECT_EQ(ssid(), "null");
    station.connect(profileWith("u", "u"));
    EXPECT_EQ(ssid(), R"("C\u00e9")");
    station.machine.advance(200);
    EXPECT_EQ(ssid(), R"("C\u00e9")");
    station.perform("{'do': 'interfaceState', 'value': 4}");
    EXPECT_EQ(station.state(), "disconnected");
    station.perform("{'do': 'interfaceState', 'value': null}");
    EXPECT_EQ(station.state(), "connected");
    station.perform("{'do': 'dropConnection'}");
    EXPECT_EQ(ssid(), "null");
}

TEST(ConnectionCalls, AreKeptWithWhatTheyAskedFor) {
    Station station(kScenario);
    station.connect("<a>\xC3\xA9</a>");
    station.machine.advance(5);
    station.discover("C\xE9");
    station.disconnect();
    EXPECT_EQ(compactJson(station.machine.query("{'query': 'calls'}")),
              R"([{"atMs":0,"call":"WlanConnect","flags":1,"mode":1,"profile":"<a>\u00e9</a>",)"
              R"("result":1206,"ssid":null},)"
              R"({"atMs":5,"call":"WlanConnect","flags":1,"mode":2,"profile":null,"result":0,)"
              R"("ssid":"C\u00e9"},)"
              R"({"atMs":5,"call":"WlanDisconnect","result":0}])");
}

TEST(ConnectionCalls, FailOnDemand) {
    Station station(kScenario);
    for (const char* call : {"WlanConnect", "WlanDisconnect", "WlanReasonCodeToString"})
        station.perform("{'do': 'fail', 'error': 77, 'call': '" + std::string(call) + "'}");
    char16_t text[4];
    EXPECT_EQ(station.connect(profileWith("u", "u")), 77U);
    EXPECT_EQ(station.disconnect(), 77U);
    EXPECT_EQ(WlanReasonCodeToString(0, 4, text, nullptr), 77U);
    EXPECT_EQ(station.told(), Told{});
    EXPECT_EQ(station.connect(profileWith("u", "u")), ERROR_SUCCESS);
}

TEST(ConnectionCalls, ReasonsHaveTheirTexts) {
    TestMachine machine;
    const struct {
        DWORD reason;
        DWORD size;
        std::u16string text;
    } cases[] = {
        {0, 256, u"The operation was successful."},
        {0x00028002, 256, u"The user disconnected."},
        {0x00028003, 256, u"The connection was lost."},
        {0x00038002, 256, u"The network is not available."},
        {0x00038003, 256, u"The connection was cancelled."},
        {0x00050007, 256, u"The user name or password is not correct, or the certificate was refused."},
        {0x00050007, 64, u"The user name or password is not correct, or the certificate wa"},
        {1, 256, u"The reason is unknown."},
        {1, 1, u""},
    };
    for (const auto& [reason, size, text] : cases) {
        std::u16string buffer(size + 1, u'#');
        EXPECT_EQ(WlanReasonCodeToString(reason, size, buffer.data(), nullptr), ERROR_SUCCESS);
        EXPECT_TRUE(buffer.c_str() == text) << reason << " " << size;
        EXPECT_EQ(buffer.back(), u'#');
    }
    char16_t one = u'#';
    EXPECT_EQ(WlanReasonCodeToString(0, 0, &one, nullptr), ERROR_INVALID_PARAMETER);
    EXPECT_EQ(WlanReasonCodeToString(0, 5, nullptr, nullptr), ERROR_INVALID_PARAMETER);
}

}  // namespace
}  // namespace vexa::simulation
