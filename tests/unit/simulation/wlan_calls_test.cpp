#include <gtest/gtest.h>

#include "Station.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {
namespace {

const std::string kScenario =
    "{'adapters': [{}, {}, {'inserted': false}], 'networks': [{'bssid': '02:00:00:00:00:01', 'ssidHex': "
    "'43e9', 'channel': 11, 'accepts': [{'eapMethod': 21}]}]}";

const std::string kProfile = ttlsProfile("C\xC3\xA9", "43E9");

std::string profileWith(const std::string& part, const std::string& replacement) {
    std::string profile = kProfile;
    return profile.replace(profile.find(part), part.size(), replacement);
}

class WlanCalls : public ::testing::Test {
protected:
    Station& on(std::size_t adapter) {
        station.guid = station.machine->adapters().guid(adapter);
        return station;
    }

    DWORD query(int opcode) { return station.query(static_cast<WLAN_INTF_OPCODE>(opcode), answer); }

    /// What each of the calls with a handle gives.
    std::vector<DWORD> resultsWith(HANDLE handle) {
        WLAN_CONNECTION_PARAMETERS parameters{};
        PWLAN_INTERFACE_INFO_LIST list = nullptr;
        PVOID data = nullptr;
        DWORD size = 0;
        return {WlanCloseHandle(handle, nullptr),
                WlanEnumInterfaces(handle, nullptr, &list),
                WlanQueryInterface(handle, &station.guid, wlan_intf_opcode_radio_state, nullptr, &size, &data,
                                   nullptr),
                WlanRegisterNotification(handle, 0, FALSE, nullptr, nullptr, nullptr, nullptr),
                WlanIhvControl(handle, &station.guid, wlan_ihv_control_type_driver, 0, nullptr, 0, nullptr,
                               &size),
                WlanConnect(handle, &station.guid, &parameters, nullptr),
                WlanDisconnect(handle, &station.guid, nullptr)};
    }

    std::string calls(const std::string& members = "") {
        return compactJson(station.machine.query("{'query': 'calls'" + members + "}"));
    }

    Station station{kScenario};
    Bytes answer;
};

TEST_F(WlanCalls, AHandleIsGoodUntilItIsClosed) {
    const auto handles = [&] { return station.machine.query("{'query': 'handles'}").asUInt(); };
    HANDLE other = nullptr;
    {
        const Listener another;
        other = another.handle();
        EXPECT_NE(other, station.listener.handle());
        EXPECT_EQ(handles(), 2U);
    }
    EXPECT_EQ(handles(), 1U);
    for (const HANDLE bad : {HANDLE{nullptr}, other, INVALID_HANDLE_VALUE})
        EXPECT_EQ(resultsWith(bad), std::vector<DWORD>(7, ERROR_INVALID_HANDLE));
}

TEST_F(WlanCalls, CanAllBeMadeToFail) {
    for (const std::string call : {"CloseHandle", "EnumInterfaces", "QueryInterface", "RegisterNotification",
                                   "IhvControl", "Connect", "Disconnect", "ReasonCodeToString"})
        station.act("{'do': 'fail', 'error': 77, 'call': 'Wlan" + call + "'}");
    EXPECT_EQ(resultsWith(station.listener.handle()), std::vector<DWORD>(7, 77));
    char16_t text[4];
    EXPECT_EQ(WlanReasonCodeToString(0, 4, text, nullptr), 77U);
    EXPECT_EQ(station.connect(kProfile), ERROR_SUCCESS);
}

TEST_F(WlanCalls, AnAdapterIsServedWhileItIsInsertedAndItsModulesOnTheFirstAlone) {
    const Bytes bssList = *bytesFromHex(hex("005ec403 00000000 05000000") + zeros(8));
    const std::tuple<std::size_t, DWORD, DWORD, DWORD, DWORD> cases[] = {
        {2, ERROR_NOT_FOUND, ERROR_NOT_FOUND, ERROR_NOT_FOUND, ERROR_NOT_FOUND},
        {1, ERROR_SUCCESS, ERROR_INVALID_PARAMETER, ERROR_INVALID_STATE, ERROR_SUCCESS},
        {0, ERROR_SUCCESS, ERROR_SUCCESS, ERROR_SUCCESS, ERROR_SUCCESS}};
    for (const auto& [adapter, asked, controlled, connected, disconnected] : cases) {
        on(adapter);
        EXPECT_EQ(query(wlan_intf_opcode_radio_state), asked) << adapter;
        EXPECT_EQ(station.control(wlan_ihv_control_type_service, bssList, 52), controlled) << adapter;
        EXPECT_EQ(station.connect(kProfile), connected) << adapter;
        EXPECT_EQ(station.disconnect(), disconnected) << adapter;
    }
    EXPECT_EQ(query(5), ERROR_INVALID_PARAMETER);
    for (const std::string radio : {"hardware", "software"}) {
        station.act("{'do': 'radio', '" + radio + "': 'off'}");
        EXPECT_EQ(station.connect(kProfile), ERROR_INVALID_STATE) << radio;
        station.act("{'do': 'radio', '" + radio + "': 'unknown'}");
    }
    EXPECT_EQ(station.connect(kProfile), ERROR_SUCCESS);
}

TEST_F(WlanCalls, AProfileThatCanNotBeUsedIsRefused) {
    station.connect(kProfile);
    station.machine.advance(200);
    const std::string profiles[] = {
        "",
        profileWith(">u<", ">u & v<"),
        profileWith("</WLANProfile>", ""),
        profileWith("<hex>43E9</hex>", ""),
        profileWith("43E9", ""),
        profileWith("43E9", "43E"),
        profileWith("43E9", zeros(33)),
        "<WLANProfile><SSIDConfig><SSID><hex>43E9</hex></SSID></SSIDConfig></WLANProfile>",
        "<Other/>",
    };
    for (const std::string& profile : profiles)
        EXPECT_EQ(station.connect(profile), ERROR_BAD_PROFILE) << profile;
    EXPECT_EQ(station.state(), "connected");
}

TEST_F(WlanCalls, ParametersThatMakeNoSenseAreRefused) {
    DOT11_SSID tooLong{33, {}};
    DOT11_SSID empty{};
    DOT11_SSID good{1, {'a'}};
    const std::pair<WLAN_CONNECTION_MODE, DOT11_SSID*> cases[] = {
        {wlan_connection_mode_temporary_profile, &good},
        {wlan_connection_mode_discovery_secure, nullptr},
        {wlan_connection_mode_discovery_secure, &empty},
        {wlan_connection_mode_discovery_secure, &tooLong},
        {wlan_connection_mode_auto, &good},
    };
    for (const auto& [mode, ssid] : cases) {
        EXPECT_EQ(station.connect({mode, nullptr, ssid, nullptr, dot11_BSS_type_infrastructure, 0}),
                  ERROR_INVALID_PARAMETER)
            << mode;
    }
    EXPECT_EQ(WlanConnect(station.listener.handle(), &station.guid, nullptr, nullptr),
              ERROR_INVALID_PARAMETER);
    EXPECT_EQ(station.told(), Texts{});
}

TEST_F(WlanCalls, NotificationsOfAConnectionCarryItsProfileAndNetwork) {
    const auto fields = [](const Bytes& data) {
        EXPECT_EQ(data.size(), 572U);
        return at(data, 0, 12) + at(data, 516, 8) + at(data, 552, 20);
    };
    const std::string known = hex("4300e90000000000 02000000 43e90000 01000000 01000000 00000000") + zeros(8);
    station.connect(kProfile);
    station.machine.advance(200);
    station.act(
        "{'do': 'connection', 'code': 10, 'profileName': 'Gr\xC3\xBC', 'ssidHex': '4772C3', "
        "'reason': 229378}");
    station.discover("C\xE9");
    station.told();
    const auto heard = station.listener.heard();
    ASSERT_EQ(station.listener.codes(), "8/9 16/1 16/2 16/3 16/4 8/10 8/10 8/20 16/9 16/10 8/21 8/9 16/1");
    EXPECT_EQ(fields(heard[0].data), hex("01000000") + known);
    EXPECT_EQ(fields(heard[5].data), hex("01000000") + known);
    EXPECT_EQ(fields(heard[6].data),
              hex("01000000 47007200fc000000 03000000 4772c300 01000000 01000000 02800300") + zeros(8));
    EXPECT_EQ(fields(heard[11].data), hex("02000000") + known) << "a name that is the SSID, widened";
    for (const std::size_t msm : {1U, 2U, 3U, 4U, 8U, 9U, 12U})
        EXPECT_TRUE(heard[msm].data.empty());
}

TEST_F(WlanCalls, ALongNameOfAProfileIsCut) {
    station.connect(ttlsProfile(std::string(300, 'x'), "43e9"));
    station.told();
    EXPECT_EQ(at(station.listener.heard().at(0).data, 4 + 2 * 254, 8), hex("78000000 02000000"));
}

TEST_F(WlanCalls, TheCurrentConnectionIsAnsweredWhileThereIsOne) {
    const auto current = [&] {
        const Json::Value ssid = station.machine.query("{'query': 'interface'}")["ssid"];
        const DWORD result = query(wlan_intf_opcode_current_connection);
        EXPECT_EQ(compactJson(ssid), result == ERROR_SUCCESS ? R"("C\u00e9")" : "null");
        return result == ERROR_SUCCESS ? at(answer, 0, 4) : std::to_string(result);
    };
    EXPECT_EQ(current(), std::to_string(ERROR_INVALID_STATE));
    station.connect(kProfile);
    EXPECT_EQ(current(), "05000000");
    station.machine.advance(200);
    EXPECT_EQ(current(), "01000000");
    ASSERT_EQ(answer.size(), 604U);
    EXPECT_EQ(at(answer, 4, 12), hex("01000000 4300e90000000000"));
    EXPECT_EQ(at(answer, 520, 8), hex("02000000 43e90000"));
    EXPECT_EQ(at(answer, 556, 12), hex("01000000 020000000001 0000"));
    EXPECT_EQ(at(answer, 588, 16), hex("01000000 01000000 06000000 04000000"));
    station.act("{'do': 'interfaceState', 'value': 3}");
    EXPECT_EQ(current(), "03000000");
    EXPECT_EQ(station.state(), "disconnecting");
    station.act("{'do': 'interfaceState', 'value': null}");
    EXPECT_EQ(station.state(), "connected");
    station.disconnect();
    station.told();
    EXPECT_EQ(current(), std::to_string(ERROR_INVALID_STATE));
    station.act("{'do': 'pullAdapter', 'adapter': 1}");
    station.act("{'do': 'pullAdapter'}");
    EXPECT_EQ(station.state(), "not_ready");
}

TEST_F(WlanCalls, AreKeptWithWhatTheyAskedFor) {
    station.connect("<a>\xC3\xA9</a>");
    station.machine.advance(5);
    station.discover("C\xE9");
    station.disconnect();
    EXPECT_EQ(calls(), R"([{"atMs":0,"call":"WlanConnect","flags":1,"mode":1,"profile":"<a>\u00e9</a>",)"
                       R"("result":1206,"ssid":null},{"atMs":5,"call":"WlanConnect","flags":1,"mode":2,)"
                       R"("profile":null,"result":0,"ssid":"C\u00e9"},)"
                       R"({"atMs":5,"call":"WlanDisconnect","result":0}])");
    station.told();
    station.act("{'do': 'clearCalls'}");
    query(wlan_intf_opcode_radio_state);
    on(2).control(wlan_ihv_control_type_driver, {0xAB, 0xCD}, 3);
    const std::string control =
        R"({"atMs":5,"call":"WlanIhvControl","inHex":"abcd","outSize":3,"result":1168,"type":1}])";
    EXPECT_EQ(calls(), "[" + control);
    EXPECT_EQ(calls(", 'all': true"),
              R"([{"atMs":5,"call":"WlanQueryInterface","opcode":4,"result":0},)" + control);
}

TEST_F(WlanCalls, ReasonsHaveTextsThatAreCutToTheBuffer) {
    const std::tuple<DWORD, DWORD, std::u16string> cases[] = {
        {0x00028003, 256, u"The connection was lost."},
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
