#include "simulation/Actions.h"

#include <algorithm>

#include "platform/ClockControl.h"
#include "simulation/ActionInput.h"
#include "simulation/AdapterSetup.h"
#include "simulation/Machine.h"
#include "simulation/Wire.h"

namespace vexa::simulation {

namespace {

constexpr DWORD kArrival = 13;
constexpr DWORD kRemoval = 14;
constexpr DWORD kRoamingStart = 5;
constexpr DWORD kRoamingEnd = 6;
constexpr DWORD kRadioStateChange = 7;

std::optional<DOT11_RADIO_STATE> radioOf(const Json::Value& action, const char* name) {
    if (!action.isMember(name)) return std::nullopt;
    return readRadioState(memberOf(action, name));
}

void pull(Machine& machine, std::size_t adapter) {
    if (machine.adapters().served() == adapter) {
        machine.spectral().abandonScan();
        machine.hotspot().abandonQueries();
    }
    machine.adapters().setInserted(adapter, false);
}

WLAN_CONNECTION_NOTIFICATION_DATA connectionBlock(const Json::Value& action) {
    WLAN_CONNECTION_NOTIFICATION_DATA block{};
    block.wlanConnectionMode = wlan_connection_mode_temporary_profile;
    block.dot11BssType = dot11_BSS_type_infrastructure;
    block.bSecurityEnabled = TRUE;
    block.wlanReasonCode = unsignedOf(action, "reason", 0);
    const std::u16string name = utf16(action["profileName"].asString());
    if (name.size() >= WLAN_MAX_NAME_LENGTH) memberOf(action, "profileName").fail("more than 255 characters");
    std::copy(name.begin(), name.end(), block.strProfileName);
    const Bytes ssid = action.isMember("ssidHex") ? memberOf(action, "ssidHex").hex() : Bytes{};
    if (ssid.size() > DOT11_SSID_MAX_LENGTH) memberOf(action, "ssidHex").fail("more than 32 bytes");
    block.dot11Ssid.uSSIDLength = static_cast<ULONG>(ssid.size());
    std::copy(ssid.begin(), ssid.end(), block.dot11Ssid.ucSSID);
    return block;
}

}  // namespace

Ticket runRadio(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const std::size_t adapter = machine.usualAdapter();
    const auto change = [&machine, adapter, hardware = radioOf(action, "hardware"),
                         software = radioOf(action, "software")](Bytes& data) {
        machine.adapters().setRadio(adapter, hardware, software);
        const RadioState radio = machine.adapters().radio(adapter);
        data = bytesOf(WLAN_PHY_RADIO_STATE{0, radio.software, radio.hardware});
    };
    return machine.notifications().post(
        {WLAN_NOTIFICATION_SOURCE_MSM, kRadioStateChange, machine.adapters().guid(adapter), {}, change});
}

Ticket runPullAdapter(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const std::size_t adapter = existingAdapterOf(machine, action);
    return machine.notifications().post({WLAN_NOTIFICATION_SOURCE_ACM,
                                         kRemoval,
                                         machine.adapters().guid(adapter),
                                         {},
                                         [&machine, adapter](Bytes&) { pull(machine, adapter); }});
}

Ticket runInsertAdapter(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const std::size_t adapter = existingAdapterOf(machine, action);
    return machine.notifications().post(
        {WLAN_NOTIFICATION_SOURCE_ACM,
         kArrival,
         machine.adapters().guid(adapter),
         {},
         [&machine, adapter](Bytes&) { machine.adapters().setInserted(adapter, true); }});
}

Ticket runSetSession(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    machine.setSession(readSessionState(memberOf(action, "session")));
    return 0;
}

Ticket runConnection(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.notifications().post({WLAN_NOTIFICATION_SOURCE_ACM, action["code"].asUInt(),
                                         usualGuid(machine), bytesOf(connectionBlock(action)), nullptr});
}

Ticket runRoam(Machine& machine, const Json::Value& /*action*/, Asker /*asker*/) {
    const GUID guid = usualGuid(machine);
    machine.notifications().post({WLAN_NOTIFICATION_SOURCE_MSM, kRoamingStart, guid, {}, nullptr});
    return machine.notifications().post({WLAN_NOTIFICATION_SOURCE_MSM, kRoamingEnd, guid, {}, nullptr});
}

Ticket runSetDns(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    std::vector<std::string> addresses;
    for (const Json::Value& address : action["dns"])
        addresses.push_back(address.asString());
    machine.adapters().setDns(existingAdapterOf(machine, action), std::move(addresses));
    return 0;
}

Ticket runSetRegistry(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const Json::Value& value = action["value"];
    const auto text = value.isNull() ? std::nullopt : std::optional(value.asString());
    if (!machine.registry().setAutoConnect(text)) throw JsonFault("registry.json can't be written");
    return 0;
}

Ticket runSet(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const auto time = [&](const char* name) { return memberOf(action, name).milliseconds(); };
    if (action.isMember("scanMs") && !machine.spectral().setScanTime(time("scanMs"))) {
        throw JsonFault("scanMs: the machine has no spectrum");
    }
    if (action.isMember("connectMs")) machine.setConnectTime(time("connectMs"));
    if (action.isMember("anqpMs")) machine.hotspot().setAnqpTime(time("anqpMs"));
    return 0;
}

Ticket runInterfaceState(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const Json::Value& value = action["value"];
    machine.overrideInterfaceState(
        value.isNull() ? std::nullopt : std::optional(static_cast<WLAN_INTERFACE_STATE>(value.asUInt())));
    return 0;
}

Ticket runFail(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    FailRule rule;
    rule.call = action["call"].asString();
    rule.error = action["error"].asUInt();
    rule.times = unsignedOf(action, "times", 1);
    rule.skip = unsignedOf(action, "skip", 0);
    const Json::Value& match = action["match"];
    if (match.isString()) rule.match = match.asString();
    if (match.isNumeric()) rule.match = std::to_string(match.asUInt());
    machine.faults().add(std::move(rule));
    return 0;
}

Ticket runReply(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    machine.faults().add(
        ReplyRule{action["match"].asString(), dataOf(action), unsignedOf(action, "times", 1)});
    return 0;
}

Ticket runLevels(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    if (!machine.spectral().changeLevels(memberOf(action, "levels"))) {
        throw JsonFault("levels: the machine has no spectrum");
    }
    return 0;
}

Ticket runNotify(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.notifications().post({action["source"].asUInt(), action["code"].asUInt(),
                                         guidOf(machine, action), dataOf(action), nullptr});
}

Ticket runIhv(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.notifications().post(
        {WLAN_NOTIFICATION_SOURCE_IHV, 0, guidOf(machine, action), dataOf(action), nullptr});
}

// The timeline runs on a thread that has work on the way: it can't wait for the end.
Ticket runAdvance(Machine& /*machine*/, const Json::Value& action, Asker asker) {
    const platform::Duration span = memberOf(action, "ms").milliseconds();
    if (asker == Asker::Timeline) {
        platform::requestAdvance(span);
    } else if (!platform::advance(span)) {
        throw JsonFault("the service did not come to rest");
    }
    return 0;
}

Ticket runShiftTime(Machine& /*machine*/, const Json::Value& action, Asker /*asker*/) {
    platform::shiftWallTime(memberOf(action, "ms").signedMilliseconds());
    return 0;
}

Ticket runClearCalls(Machine& machine, const Json::Value& /*action*/, Asker /*asker*/) {
    machine.calls().clear();
    return 0;
}

}  // namespace vexa::simulation
