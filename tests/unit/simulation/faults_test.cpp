#include <gtest/gtest.h>

#include "TestMachine.h"
#include "platform/TcpTable.h"

namespace vexa::simulation {
namespace {

class InjectedFaults : public ::testing::Test {
protected:
    DWORD open() {
        DWORD version = 0;
        return WlanOpenHandle(2, nullptr, &version, &handle);
    }

    DWORD request(WLAN_IHV_CONTROL_TYPE type, const char* hex, DWORD outSize = 0) {
        const GUID guid = machine.guid();
        Bytes bytes = bytesFromHex(hex).value_or(Bytes{});
        output.assign(outSize, 0xEE);
        returned = 0;
        return WlanIhvControl(handle, &guid, type, static_cast<DWORD>(bytes.size()), bytes.data(), outSize,
                              output.data(), &returned);
    }

    DWORD stopScan() {
        return request(wlan_ihv_control_type_driver,
                       "01000000"
                       "0b00a3ff"
                       "00000000"
                       "08000000"
                       "0000000000000000"
                       "0000000000000000");
    }

    DWORD bssList(DWORD outSize) {
        return request(wlan_ihv_control_type_service,
                       "005ec403"
                       "00000000"
                       "05000000"
                       "00000000"
                       "00000000",
                       outSize);
    }

    DWORD query(WLAN_INTF_OPCODE opcode) {
        const GUID guid = machine.guid();
        DWORD size = 0;
        PVOID data = nullptr;
        const DWORD result = WlanQueryInterface(handle, &guid, opcode, nullptr, &size, &data, nullptr);
        if (data) WlanFreeMemory(data);
        return result;
    }

    TestMachine machine{"{'spectrum': {'channels': [1]}}"};
    HANDLE handle = nullptr;
    Bytes output;
    DWORD returned = 0;
};

TEST_F(InjectedFaults, StrikeAfterTheCallsToSkipAndAsOftenAsAsked) {
    machine.ask("{'do': 'fail', 'call': 'WlanOpenHandle', 'error': 8, 'skip': 1, 'times': 2}");
    EXPECT_EQ(open(), ERROR_SUCCESS);
    EXPECT_EQ(open(), 8U);
    EXPECT_EQ(open(), 8U);
    EXPECT_EQ(open(), ERROR_SUCCESS);
}

TEST_F(InjectedFaults, OneAfterTheOther) {
    machine.ask("{'do': 'fail', 'call': 'WlanOpenHandle', 'error': 8}");
    machine.ask("{'do': 'fail', 'call': 'WlanOpenHandle', 'error': 9}");
    EXPECT_EQ(open(), 8U);
    EXPECT_EQ(open(), 9U);
    EXPECT_EQ(open(), ERROR_SUCCESS);
}

TEST_F(InjectedFaults, StrikeOnlyWhatMatches) {
    ASSERT_EQ(open(), ERROR_SUCCESS);
    machine.ask("{'do': 'fail', 'call': 'WlanIhvControl', 'error': 31, 'match': 'channelList'}");
    machine.ask("{'do': 'fail', 'call': 'WlanIhvControl', 'error': 32, 'match': 'scan'}");
    EXPECT_EQ(stopScan(), 32U);
    EXPECT_EQ(stopScan(), ERROR_SUCCESS);
    machine.ask("{'do': 'fail', 'call': 'WlanQueryInterface', 'error': 33, 'match': 8}");
    machine.ask("{'do': 'fail', 'call': 'WlanQueryInterface', 'error': 34, 'match': '6'}");
    EXPECT_EQ(query(wlan_intf_opcode_radio_state), ERROR_SUCCESS);
    EXPECT_EQ(query(wlan_intf_opcode_interface_state), 34U);
    EXPECT_EQ(query(wlan_intf_opcode_channel_number), 33U);
    EXPECT_EQ(query(wlan_intf_opcode_channel_number), ERROR_SUCCESS);
}

TEST_F(InjectedFaults, ReachEveryCall) {
    ASSERT_EQ(open(), ERROR_SUCCESS);
    for (const char* call :
         {"WlanCloseHandle", "WlanEnumInterfaces", "WlanRegisterNotification", "GetTcpTable"}) {
        machine.ask(std::string("{'do': 'fail', 'error': 77, 'call': '") + call + "'}");
    }
    PWLAN_INTERFACE_INFO_LIST list = nullptr;
    std::uint32_t size = 0;
    EXPECT_EQ(WlanCloseHandle(handle, nullptr), 77U);
    EXPECT_EQ(WlanEnumInterfaces(handle, nullptr, &list), 77U);
    EXPECT_EQ(WlanRegisterNotification(handle, 0, FALSE, nullptr, nullptr, nullptr, nullptr), 77U);
    EXPECT_EQ(platform::getTcpTable(nullptr, size, true), 77U);
    EXPECT_EQ(WlanCloseHandle(handle, nullptr), ERROR_SUCCESS);
}

TEST_F(InjectedFaults, AReplyTakesThePlaceOfTheModules) {
    ASSERT_EQ(open(), ERROR_SUCCESS);
    machine.ask("{'do': 'reply', 'match': 'bssList', 'dataHex': 'aabbcc', 'times': 2}");
    EXPECT_EQ(bssList(4), ERROR_SUCCESS);
    EXPECT_EQ(returned, 3U);
    EXPECT_EQ(hexText(output), "aabbccee");
    EXPECT_EQ(bssList(2), ERROR_INSUFFICIENT_BUFFER);
    EXPECT_EQ(bssList(4), ERROR_SUCCESS);
    EXPECT_EQ(returned, 0U);
}

}  // namespace
}  // namespace vexa::simulation
