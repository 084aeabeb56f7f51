#include "simulation/control/Actions.h"

#include <algorithm>

#include "platform/ClockControl.h"
#include "simulation/Machine.h"
#include "simulation/control/ActionInput.h"
#include "simulation/scenario/AdapterSetup.h"
#include "simulation/text/Wire.h"

namespace vexa::simulation {

namespace {

constexpr DWORD kRoamingStart = 5;
constexpr DWORD kRoamingEnd = 6;

std::optional<DOT11_RADIO_STATE> radioOf(const Json::Value& action, const char* name) {
    if (!action.isMember(name)) return std::nullopt;
    return readRadioState(memberOf(action, name));
}

}  // namespace

Ticket runRadio(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.connections().changeRadio(machine.usualAdapter(), radioOf(action, "hardware"),
                                             radioOf(action, "software"));
}

Ticket runPullAdapter(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const std::size_t adapter = existingAdapterOf(machine, action);
    return machine.connections().pull(adapter, [&machine, adapter] {
        if (machine.adapters().served() != adapter) return;
        machine.spectral().abandonScan();
        machine.hotspot().abandonQueries();
    });
}

Ticket runInsertAdapter(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.connections().insert(existingAdapterOf(machine, action));
}

Ticket runSetSession(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    machine.setSession(readSessionState(memberOf(action, "session")));
    return 0;
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
    if (action.isMember("connectMs")) machine.connections().setConnectTime(time("connectMs"));
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
