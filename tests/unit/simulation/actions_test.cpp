#include <gtest/gtest.h>

#include "TestMachine.h"
#include "simulation/JsonText.h"

namespace vexa::simulation {
namespace {

std::string line(const Json::Value& value) {
    return compactJson(value);
}

TEST(Actions, WhatIsNotUnderstoodIsRefusedWithAReason) {
    TestMachine machine;
    struct Case {
        const char* message;
        const char* error;
    };
    const Case cases[] = {
        {"[]", "not an object"},
        {"{}", "do: missing"},
        {"{'do': 'noSuchAction'}", "do: unknown action noSuchAction"},
        {"{'do': 5}", "do: not a text"},
        {"{'do': 'roam', 'atMs': 5}", "atMs: unknown member"},
        {"{'do': 'advance'}", "ms: missing"},
        {"{'do': 'advance', 'ms': -1}", "ms: negative"},
        {"{'do': 'pullAdapter', 'adapter': 1}", "adapter: no such adapter"},
        {"{'do': 'show', 'bssid': '02:00:00:00:00:01'}", "bssid: no such network"},
        {"{'do': 'levels', 'levels': {}}", "levels: the machine has no spectrum"},
        {"{'do': 'set', 'scanMs': 5}", "scanMs: the machine has no spectrum"},
        {"{'do': 'connection', 'code': 10, 'ssidHex': "
         "'000000000000000000000000000000000000000000000000000000000000000000'}",
         "ssidHex: more than 32 bytes"},
        {"{'query': 'weather'}", "query: unknown query weather"},
        {"{'query': 'time', 'all': true}", "all: unknown member"},
        {"{'query': 'calls', 'all': 1}", "all: not a boolean"},
    };
    for (const Case& c : cases) {
        Json::Value expected;
        expected["ok"] = false;
        expected["error"] = c.error;
        EXPECT_EQ(machine.ask(c.message), line(expected)) << c.message;
    }
}

TEST(Actions, AMachineWithoutAdaptersRefusesWhatNeedsOne) {
    TestMachine machine("{'adapters': []}");
    EXPECT_EQ(machine.ask("{'do': 'pullAdapter'}"), R"({"error":"adapter: no such adapter","ok":false})");
    EXPECT_EQ(machine.ask("{'do': 'radio'}"), R"({"error":"adapter: the machine has none","ok":false})");
    EXPECT_EQ(machine.ask("{'do': 'notify', 'source': 8, 'code': 1}"), R"({"ok":true})");
}

TEST(Actions, RadioChangesTheStateBeforeItsNotification) {
    TestMachine machine;
    Listener listener;
    std::string seen;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA& data) {
        DWORD size = 0;
        PVOID answer = nullptr;
        const GUID guid = data.InterfaceGuid;
        ASSERT_EQ(WlanQueryInterface(listener.handle(), &guid, wlan_intf_opcode_radio_state, nullptr, &size,
                                     &answer, nullptr),
                  ERROR_SUCCESS);
        const auto* state = static_cast<const WLAN_RADIO_STATE*>(answer);
        seen = std::to_string(state->dwNumberOfPhys) +
               std::to_string(state->PhyRadioState[0].dot11HardwareRadioState) +
               std::to_string(state->PhyRadioState[0].dot11SoftwareRadioState);
        WlanFreeMemory(answer);
    };
    machine.ask("{'do': 'radio', 'software': 'off'}");
    EXPECT_EQ(seen, "112");
    machine.ask("{'do': 'radio', 'hardware': 'unknown'}");
    EXPECT_EQ(seen, "102");
    machine.ask("{'do': 'radio'}");
    EXPECT_EQ(listener.codes(), "16/7 16/7 16/7");
    EXPECT_EQ(hexText(listener.heard()[1].data), "000000000200000000000000");
    EXPECT_EQ(line(machine.query("{'query': 'interface'}")),
              R"({"radio":{"hardware":"unknown","software":"off"},"ssid":null,"state":"disconnected"})");
}

TEST(Actions, AConnectionNotificationHasTheLayoutOfWindows) {
    TestMachine machine;
    Listener listener;
    machine.ask(
        "{'do': 'connection', 'code': 10, 'profileName': 'Gr\xC3\xBC', 'ssidHex': '4772C3', 'reason': "
        "229378}");
    ASSERT_EQ(listener.codes(), "8/10");
    const Bytes data = listener.heard()[0].data;
    ASSERT_EQ(data.size(), 572U);
    const auto at = [&](std::size_t offset, std::size_t size) {
        return hexText(std::span(data).subspan(offset, size));
    };
    EXPECT_EQ(at(0, 12),
              "01000000"
              "4700"
              "7200"
              "fc00"
              "0000");
    EXPECT_EQ(at(516, 8),
              "03000000"
              "4772c300");
    EXPECT_EQ(at(552, 4), "01000000");
    EXPECT_EQ(at(560, 4), "02800300");
}

TEST(Actions, TheInterfaceStateCanBeOverridden) {
    TestMachine machine;
    machine.ask("{'do': 'interfaceState', 'value': 1}");
    EXPECT_EQ(machine.query("{'query': 'interface'}")["state"].asString(), "connected");
    machine.ask("{'do': 'pullAdapter'}");
    EXPECT_EQ(machine.query("{'query': 'interface'}")["state"].asString(), "connected");
    machine.ask("{'do': 'interfaceState', 'value': null}");
    EXPECT_EQ(machine.query("{'query': 'interface'}")["state"].asString(), "not_ready");
}

TEST(Actions, PullingMovesTheModulesToTheNextAdapterOfTheMaker) {
    TestMachine machine(
        "{'adapters': [{'hardwareId': 'pci\\\\ven_8086'}, {'hardwareId': 'USB\\\\VID_2B7E&PID_1'}, {}]}");
    EXPECT_EQ(machine->adapters().served(), 1U);
    machine.ask("{'do': 'pullAdapter', 'adapter': 1}");
    EXPECT_EQ(machine->adapters().served(), 2U);
    machine.ask("{'do': 'pullAdapter', 'adapter': 2}");
    EXPECT_EQ(machine->adapters().served(), std::nullopt);
    machine.ask("{'do': 'insertAdapter', 'adapter': 1}");
    EXPECT_EQ(machine->adapters().served(), 1U);
}

TEST(Actions, SessionAndDnsChangeWithoutANotification) {
    TestMachine machine;
    Listener listener;
    machine.ask("{'do': 'setSession', 'session': 'disconnected'}");
    machine.ask("{'do': 'setDns', 'dns': ['192.0.2.1', '192.0.2.2']}");
    EXPECT_EQ(machine->session(), SessionState::Disconnected);
    EXPECT_EQ(machine->adapters().snapshot(0).dns, (std::vector<std::string>{"192.0.2.1", "192.0.2.2"}));
    EXPECT_EQ(listener.codes(), "");
}

TEST(Actions, TheTimelineActsAtZeroBeforeTheMachineIsThere) {
    TestMachine machine(
        "{'timeline': [{'atMs': 0, 'do': 'pullAdapter'}, {'atMs': 0, 'do': 'show', 'bssid': "
        "'02:00:00:00:00:01'},"
        "{'atMs': 100, 'do': 'insertAdapter'}]}");
    EXPECT_TRUE(machine->adapters().inserted().empty());
    machine.advance(99);
    EXPECT_TRUE(machine->adapters().inserted().empty());
    machine.advance(1);
    EXPECT_EQ(machine->adapters().inserted().size(), 1U);
}

}  // namespace
}  // namespace vexa::simulation
