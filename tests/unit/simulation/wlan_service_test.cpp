#include <gtest/gtest.h>

#include "Station.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {
namespace {

class WlanService : public ::testing::Test {
protected:
    DWORD query(int opcode) { return station.query(static_cast<WLAN_INTF_OPCODE>(opcode), answer); }

    Station station{"{'adapters': [{}, {'inserted': false}, {'hardwareId': null}]}"};
    Bytes answer;
};

TEST_F(WlanService, AHandleIsGoodUntilItIsClosed) {
    const auto handles = [&] { return station.machine.query("{'query': 'handles'}").asUInt(); };
    HANDLE other = nullptr;
    {
        const Listener another;
        other = another.handle();
        EXPECT_NE(other, station.listener.handle());
        EXPECT_EQ(handles(), 2U);
    }
    EXPECT_EQ(handles(), 1U);
    const GUID guid = station.guid;
    WLAN_CONNECTION_PARAMETERS parameters{};
    PWLAN_INTERFACE_INFO_LIST list = nullptr;
    PVOID data = nullptr;
    DWORD size = 0;
    for (const HANDLE bad : {HANDLE{nullptr}, other, INVALID_HANDLE_VALUE}) {
        const DWORD results[] = {
            WlanCloseHandle(bad, nullptr),
            WlanEnumInterfaces(bad, nullptr, &list),
            WlanQueryInterface(bad, &guid, wlan_intf_opcode_radio_state, nullptr, &size, &data, nullptr),
            WlanRegisterNotification(bad, 0, FALSE, nullptr, nullptr, nullptr, nullptr),
            WlanIhvControl(bad, &guid, wlan_ihv_control_type_driver, 0, nullptr, 0, nullptr, &size),
            WlanConnect(bad, &guid, &parameters, nullptr),
            WlanDisconnect(bad, &guid, nullptr),
        };
        for (const DWORD result : results)
            EXPECT_EQ(result, ERROR_INVALID_HANDLE);
    }
}

TEST_F(WlanService, TheListHoldsTheInsertedAdaptersInOrder) {
    PWLAN_INTERFACE_INFO_LIST list = nullptr;
    ASSERT_EQ(WlanEnumInterfaces(station.listener.handle(), nullptr, &list), ERROR_SUCCESS);
    ASSERT_EQ(list->dwNumberOfItems, 2U);
    const auto* interfaces = static_cast<const WLAN_INTERFACE_INFO*>(list->InterfaceInfo);
    EXPECT_EQ(interfaces[0].InterfaceGuid.Data4[7], 1);
    EXPECT_EQ(interfaces[1].InterfaceGuid.Data4[7], 3);
    EXPECT_EQ(interfaces[0].isState, wlan_interface_state_disconnected);
    WlanFreeMemory(list);
}

TEST_F(WlanService, QueriesAnswerAboutInsertedAdaptersOnly) {
    EXPECT_EQ(query(wlan_intf_opcode_interface_state), ERROR_SUCCESS);
    EXPECT_EQ(hexText(answer), "04000000");
    EXPECT_EQ(query(wlan_intf_opcode_channel_number), ERROR_SUCCESS);
    EXPECT_EQ(hexText(answer), "00000000");
    EXPECT_EQ(query(5), ERROR_INVALID_PARAMETER);
    station.guid = station.machine->adapters().guid(1);
    EXPECT_EQ(query(wlan_intf_opcode_radio_state), ERROR_NOT_FOUND);
}

TEST_F(WlanService, CallsAreKept) {
    station.machine.advance(5);
    query(wlan_intf_opcode_radio_state);
    station.guid = station.machine->adapters().guid(1);
    station.control(wlan_ihv_control_type_driver, {0xAB, 0xCD}, 3);
    const std::string control =
        R"({"atMs":5,"call":"WlanIhvControl","inHex":"abcd","outSize":3,"result":1168,"type":1})";
    const auto calls = [&](const std::string& members) {
        return compactJson(station.machine.query("{'query': 'calls'" + members + "}"));
    };
    EXPECT_EQ(calls(""), "[" + control + "]");
    EXPECT_EQ(calls(", 'all': true"),
              R"([{"atMs":5,"call":"WlanQueryInterface","opcode":4,"result":0},)" + control + "]");
    station.act("{'do': 'clearCalls'}");
    EXPECT_EQ(calls(", 'all': true"), "[]");
}

}  // namespace
}  // namespace vexa::simulation
