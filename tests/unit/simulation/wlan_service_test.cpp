#include <gtest/gtest.h>

#include "TestMachine.h"
#include "simulation/JsonText.h"

namespace vexa::simulation {
namespace {

class WlanService : public ::testing::Test {
protected:
    WlanService() {
        DWORD version = 0;
        EXPECT_EQ(WlanOpenHandle(2, nullptr, &version, &handle), ERROR_SUCCESS);
        EXPECT_EQ(version, 2U);
    }

    DWORD query(HANDLE client, const GUID& guid, WLAN_INTF_OPCODE opcode, Bytes* answer = nullptr) {
        DWORD size = 0;
        PVOID data = nullptr;
        const DWORD result = WlanQueryInterface(client, &guid, opcode, nullptr, &size, &data, nullptr);
        const auto* bytes = static_cast<const std::uint8_t*>(data);
        if (answer && bytes) *answer = Bytes(bytes, bytes + size);
        if (data) WlanFreeMemory(data);
        return result;
    }

    TestMachine machine{"{'adapters': [{}, {'inserted': false}, {'hardwareId': null}]}"};
    HANDLE handle = nullptr;
};

TEST_F(WlanService, AHandleIsGoodUntilItIsClosed) {
    HANDLE other = nullptr;
    DWORD version = 0;
    ASSERT_EQ(WlanOpenHandle(2, nullptr, &version, &other), ERROR_SUCCESS);
    EXPECT_NE(other, handle);
    EXPECT_EQ(machine.query("{'query': 'handles'}").asUInt(), 2U);
    EXPECT_EQ(WlanCloseHandle(other, nullptr), ERROR_SUCCESS);
    EXPECT_EQ(WlanCloseHandle(other, nullptr), ERROR_INVALID_HANDLE);
    EXPECT_EQ(machine.query("{'query': 'handles'}").asUInt(), 1U);
    for (HANDLE bad : {HANDLE{nullptr}, other, INVALID_HANDLE_VALUE}) {
        PWLAN_INTERFACE_INFO_LIST list = nullptr;
        DWORD size = 0;
        EXPECT_EQ(WlanEnumInterfaces(bad, nullptr, &list), ERROR_INVALID_HANDLE);
        EXPECT_EQ(query(bad, machine.guid(), wlan_intf_opcode_radio_state), ERROR_INVALID_HANDLE);
        EXPECT_EQ(WlanRegisterNotification(bad, 0, FALSE, nullptr, nullptr, nullptr, nullptr),
                  ERROR_INVALID_HANDLE);
        const GUID guid = machine.guid();
        EXPECT_EQ(WlanIhvControl(bad, &guid, wlan_ihv_control_type_driver, 0, nullptr, 0, nullptr, &size),
                  ERROR_INVALID_HANDLE);
    }
}

TEST_F(WlanService, TheListHoldsTheInsertedAdaptersInOrder) {
    PWLAN_INTERFACE_INFO_LIST list = nullptr;
    ASSERT_EQ(WlanEnumInterfaces(handle, nullptr, &list), ERROR_SUCCESS);
    ASSERT_EQ(list->dwNumberOfItems, 2U);
    const auto* interfaces = static_cast<const WLAN_INTERFACE_INFO*>(list->InterfaceInfo);
    EXPECT_EQ(interfaces[0].InterfaceGuid.Data4[7], 1);
    EXPECT_EQ(interfaces[1].InterfaceGuid.Data4[7], 3);
    EXPECT_EQ(interfaces[0].isState, wlan_interface_state_disconnected);
    WlanFreeMemory(list);
}

TEST_F(WlanService, QueriesAnswerAboutInsertedAdaptersOnly) {
    Bytes answer;
    EXPECT_EQ(query(handle, machine.guid(), wlan_intf_opcode_interface_state, &answer), ERROR_SUCCESS);
    EXPECT_EQ(hexText(answer), "04000000");
    EXPECT_EQ(query(handle, machine.guid(), wlan_intf_opcode_channel_number, &answer), ERROR_SUCCESS);
    EXPECT_EQ(hexText(answer), "00000000");
    EXPECT_EQ(query(handle, machine.guid(), wlan_intf_opcode_current_connection), ERROR_INVALID_STATE);
    EXPECT_EQ(query(handle, machine.guid(), static_cast<WLAN_INTF_OPCODE>(5)), ERROR_INVALID_PARAMETER);
    EXPECT_EQ(query(handle, machine->adapters().guid(1), wlan_intf_opcode_radio_state), ERROR_NOT_FOUND);
}

TEST_F(WlanService, CallsAreKept) {
    const GUID guid = machine.guid();
    const GUID pulled = machine->adapters().guid(1);
    std::uint8_t request[] = {0xAB, 0xCD};
    std::uint8_t output[3];
    DWORD returned = 0;
    machine.advance(5);
    WlanIhvControl(handle, &pulled, wlan_ihv_control_type_driver, 2, request, 3, output, &returned);
    query(handle, guid, wlan_intf_opcode_radio_state);
    EXPECT_EQ(compactJson(machine.query("{'query': 'calls'}")),
              R"([{"atMs":5,"call":"WlanIhvControl","inHex":"abcd","outSize":3,"result":1168,"type":1}])");
    const Json::Value all = machine.query("{'query': 'calls', 'all': true}");
    ASSERT_EQ(all.size(), 2U);
    EXPECT_EQ(compactJson(all[1]), R"({"atMs":5,"call":"WlanQueryInterface","opcode":4,"result":0})");
    machine.ask("{'do': 'clearCalls'}");
    EXPECT_EQ(machine.query("{'query': 'calls', 'all': true}").size(), 0U);
}

}  // namespace
}  // namespace vexa::simulation
