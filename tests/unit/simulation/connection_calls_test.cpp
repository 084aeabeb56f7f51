#include <gtest/gtest.h>

#include "Station.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {
namespace {

const std::string kScenario =
    "{'networks': [{'bssid': '02:00:00:00:00:01', 'ssidHex': '43e9', 'channel': 11, 'accepts': "
    "[{'eapMethod': 21}]}]}";

const std::string kProfile = ttlsProfile("C\xC3\xA9", "43E9");

std::string profileWith(const std::string& part, const std::string& replacement) {
    std::string profile = kProfile;
    return profile.replace(profile.find(part), part.size(), replacement);
}

/// Of a connection's notification: the mode and the beginning of the profile's name, the SSID, and all that
/// follows it.
std::string fields(const Bytes& data) {
    EXPECT_EQ(data.size(), 572U);
    return at(data, 0, 12) + at(data, 516, 8) + at(data, 552, 20);
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
        profileWith("43E9", zeros(33)),
        "<WLANProfile><SSIDConfig><SSID><hex>43E9</hex></SSID></SSIDConfig></WLANProfile>",
        "<Other/>",
    };
    for (const std::string& profile : profiles)
        EXPECT_EQ(station.connect(profile), ERROR_BAD_PROFILE) << profile;
    EXPECT_EQ(station.told(), Texts{});
    EXPECT_EQ(station.connect(kProfile), ERROR_SUCCESS);
    station.machine.advance(200);
    EXPECT_EQ(station.connect("no profile"), ERROR_BAD_PROFILE);
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
        {wlan_connection_mode_temporary_profile, &good},
        {wlan_connection_mode_discovery_secure, nullptr},
        {wlan_connection_mode_discovery_secure, &tooLong},
        {wlan_connection_mode_auto, &good},
    };
    for (const auto& [mode, ssid] : cases) {
        EXPECT_EQ(station.connect({mode, nullptr, ssid, nullptr, dot11_BSS_type_infrastructure, 0}),
                  ERROR_INVALID_PARAMETER)
            << mode;
    }
    EXPECT_EQ(station.discover(""), ERROR_INVALID_PARAMETER);
    EXPECT_EQ(WlanConnect(station.listener.handle(), &station.guid, nullptr, nullptr),
              ERROR_INVALID_PARAMETER);
    EXPECT_EQ(station.told(), Texts{});
}

TEST(ConnectionCalls, AdaptersAndRadiosAreChecked) {
    Station station("{'adapters': [{}, {}, {'inserted': false}]}");
    const auto on = [&](std::size_t adapter) -> Station& {
        station.guid = station.machine->adapters().guid(adapter);
        return station;
    };
    EXPECT_EQ(on(2).connect(kProfile), ERROR_NOT_FOUND);
    EXPECT_EQ(on(2).disconnect(), ERROR_NOT_FOUND);
    EXPECT_EQ(on(1).connect(kProfile), ERROR_INVALID_STATE);
    EXPECT_EQ(on(1).disconnect(), ERROR_SUCCESS);
    for (const std::string radio : {"hardware", "software"}) {
        station.act("{'do': 'radio', '" + radio + "': 'off'}");
        EXPECT_EQ(on(0).connect(kProfile), ERROR_INVALID_STATE) << radio;
        station.act("{'do': 'radio', '" + radio + "': 'unknown'}");
    }
    EXPECT_EQ(on(0).connect(kProfile), ERROR_SUCCESS);
}

TEST(ConnectionCalls, NotificationsCarryTheProfileAndTheNetwork) {
    const std::string own = hex("01000000 4300e90000000000 02000000 43e90000");
    const std::string noReason = hex("01000000 01000000 00000000 00000000 00000000");
    Station station(kScenario);
    station.connect(kProfile);
    station.machine.advance(200);
    auto heard = station.listener.heard();
    ASSERT_EQ(station.listener.codes(), "8/9 16/1 16/2 16/3 16/4 8/10");
    for (const std::size_t acm : {0U, 5U})
        EXPECT_EQ(fields(heard[acm].data), own + noReason);
    for (const std::size_t msm : {1U, 2U, 3U, 4U})
        EXPECT_TRUE(heard[msm].data.empty());

    station.act(
        "{'do': 'connection', 'code': 10, 'profileName': 'Gr\xC3\xBC', 'ssidHex': '4772C3', "
        "'reason': 229378}");
    heard = station.listener.heard();
    EXPECT_EQ(fields(heard[6].data), hex("01000000 47007200fc000000 03000000 4772c300 01000000 01000000") +
                                         hex("02800300 00000000 00000000"));
}

TEST(ConnectionCalls, AProfileNamedByItsSsidIsTheSsidWidenedAndALongNameIsCut) {
    Station station(kScenario);
    station.discover("C\xE9");
    station.connect(ttlsProfile(std::string(300, 'x'), "43e9"));
    station.told();
    const auto heard = station.listener.heard();
    EXPECT_EQ(fields(heard.front().data).substr(0, 40), hex("02000000 4300e90000000000 02000000 43e90000"));
    EXPECT_EQ(at(heard.at(3).data, 4 + 2 * 254, 8), hex("78000000 02000000"));
}

TEST(ConnectionCalls, TheCurrentConnectionIsAnsweredWhileThereIsOne) {
    Station station(kScenario);
    Bytes answer;
    const auto ask = [&] { return station.query(wlan_intf_opcode_current_connection, answer); };
    EXPECT_EQ(ask(), ERROR_INVALID_STATE);
    station.connect(kProfile);
    ASSERT_EQ(ask(), ERROR_SUCCESS);
    EXPECT_EQ(at(answer, 0, 4), "05000000");
    station.machine.advance(200);
    ASSERT_EQ(ask(), ERROR_SUCCESS);
    ASSERT_EQ(answer.size(), 604U);
    EXPECT_EQ(at(answer, 0, 16), hex("01000000 01000000 4300e90000000000"));
    EXPECT_EQ(at(answer, 520, 8), hex("02000000 43e90000"));
    EXPECT_EQ(at(answer, 556, 12), hex("01000000 020000000001 0000"));
    EXPECT_EQ(at(answer, 588, 16), hex("01000000 01000000 06000000 04000000"));
    station.act("{'do': 'interfaceState', 'value': 3}");
    ASSERT_EQ(ask(), ERROR_SUCCESS);
    EXPECT_EQ(at(answer, 0, 4), "03000000");
    station.disconnect();
    station.told();
    EXPECT_EQ(ask(), ERROR_INVALID_STATE);
}

TEST(ConnectionCalls, TheInterfaceQueryTellsTheSsidAndTheStateThatIsPretended) {
    Station station(kScenario);
    const auto ssid = [&] { return compactJson(station.machine.query("{'query': 'interface'}")["ssid"]); };
    EXPECT_EQ(ssid(), "null");
    station.connect(kProfile);
    EXPECT_EQ(ssid(), R"("C\u00e9")");
    station.machine.advance(200);
    EXPECT_EQ(ssid(), R"("C\u00e9")");
    station.act("{'do': 'interfaceState', 'value': 4}");
    EXPECT_EQ(station.state(), "disconnected");
    station.act("{'do': 'interfaceState', 'value': null}");
    EXPECT_EQ(station.state(), "connected");
    station.act("{'do': 'dropConnection'}");
    EXPECT_EQ(ssid(), "null");
    station.act("{'do': 'pullAdapter'}");
    EXPECT_EQ(station.state(), "not_ready");
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
        {0x00050007, 64, u"The user name or password is not correct, or the certificate wa"},
        {0x00050007, 256, u"The user name or password is not correct, or the certificate was refused."},
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
