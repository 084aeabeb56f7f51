#include <gtest/gtest.h>

#include "Station.h"

namespace vexa::simulation {
namespace {

class InjectedFaults : public ::testing::Test {
protected:
    static DWORD open() {
        DWORD version = 0;
        HANDLE handle = nullptr;
        return WlanOpenHandle(2, nullptr, &version, &handle);
    }

    DWORD query(WLAN_INTF_OPCODE opcode) {
        Bytes answer;
        return station.query(opcode, answer);
    }

    DWORD stopScan() {
        return station.control(wlan_ihv_control_type_driver,
                               *bytesFromHex(hex("01000000 0b00a3ff 00000000 08000000") + zeros(16)));
    }

    DWORD bssList(DWORD capacity) {
        return station.control(wlan_ihv_control_type_service,
                               *bytesFromHex(hex("005ec403 00000000 05000000") + zeros(8)), capacity);
    }

    Station station{"{'spectrum': {'channels': [1]}}"};
};

TEST_F(InjectedFaults, StrikeOneAfterTheOtherAfterTheCallsToSkipAndAsOftenAsAsked) {
    station.act("{'do': 'fail', 'call': 'WlanOpenHandle', 'error': 8, 'skip': 1, 'times': 2}");
    station.act("{'do': 'fail', 'call': 'WlanOpenHandle', 'error': 9}");
    station.act("{'do': 'fail', 'call': 'WlanOpenHandle', 'error': 10}");
    for (const DWORD result : {9U, 8U, 8U, 10U, DWORD{ERROR_SUCCESS}})
        EXPECT_EQ(open(), result);
}

TEST_F(InjectedFaults, StrikeOnlyWhatMatches) {
    station.act("{'do': 'fail', 'call': 'WlanIhvControl', 'error': 31, 'match': 'channelList'}");
    station.act("{'do': 'fail', 'call': 'WlanIhvControl', 'error': 32, 'match': 'scan'}");
    EXPECT_EQ(stopScan(), 32U);
    EXPECT_EQ(stopScan(), ERROR_SUCCESS);
    station.act("{'do': 'fail', 'call': 'WlanQueryInterface', 'error': 33, 'match': 8}");
    station.act("{'do': 'fail', 'call': 'WlanQueryInterface', 'error': 34, 'match': '6'}");
    EXPECT_EQ(query(wlan_intf_opcode_radio_state), ERROR_SUCCESS);
    EXPECT_EQ(query(wlan_intf_opcode_interface_state), 34U);
    EXPECT_EQ(query(wlan_intf_opcode_channel_number), 33U);
    EXPECT_EQ(query(wlan_intf_opcode_channel_number), ERROR_SUCCESS);
}

TEST_F(InjectedFaults, AReplyTakesThePlaceOfTheModules) {
    station.act("{'do': 'reply', 'match': 'bssList', 'dataHex': 'aabbcc', 'times': 2}");
    EXPECT_EQ(bssList(4), ERROR_SUCCESS);
    EXPECT_EQ(hexText(station.output), "aabbcc");
    EXPECT_EQ(bssList(2), ERROR_INSUFFICIENT_BUFFER);
    EXPECT_EQ(bssList(4), ERROR_SUCCESS);
    EXPECT_EQ(hexText(station.output), "");
}

}  // namespace
}  // namespace vexa::simulation
