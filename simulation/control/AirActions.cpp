// Actions on the networks in the air and on what the hotspot module tells of them.

#include "simulation/control/ActionInput.h"
#include "simulation/control/Actions.h"
#include "simulation/modules/HotspotMessages.h"

namespace vexa::simulation {

namespace {

constexpr std::uint32_t kYes = 1;

Ticket postHotspotMessage(Machine& machine, Bytes message, std::function<void(Bytes&)> before = nullptr) {
    return machine.notifications().post(
        {WLAN_NOTIFICATION_SOURCE_IHV, 0, usualGuid(machine), std::move(message), std::move(before)});
}

}  // namespace

Ticket runShow(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    machine.airspace().setVisible(existingNetworkOf(machine, action).bssid, true);
    return 0;
}

Ticket runHide(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const Network network = existingNetworkOf(machine, action);
    machine.airspace().setVisible(network.bssid, false);
    return machine.connections().dropFrom(network.bssid);
}

Ticket runAddNetwork(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const JsonPlace network = memberOf(action, "network");
    if (!machine.airspace().add(readNetwork(network))) network.member("bssid").fail("is there already");
    return 0;
}

Ticket runSetNetwork(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const Network network = existingNetworkOf(machine, action);
    Json::Value changes = action;
    changes.removeMember("do");
    machine.airspace().change(JsonPlace(changes, ""));
    const bool isGone = action.isMember("visible") && !action["visible"].asBool();
    return isGone ? machine.connections().dropFrom(network.bssid) : 0;
}

Ticket runReportNetworks(Machine& machine, const Json::Value& /*action*/, Asker /*asker*/) {
    return machine.hotspot().reportNetworks(usualGuid(machine));
}

Ticket runReportAnqp(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.hotspot().reportAnqp(usualGuid(machine), existingNetworkOf(machine, action));
}

Ticket runCompleteAnqpQuery(Machine& machine, const Json::Value& /*action*/, Asker /*asker*/) {
    return machine.hotspot().completeNextQuery(usualGuid(machine));
}

Ticket runUserDisconnect(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    const Bytes ssid = bytesOfText(action, "ssid");
    const auto network = machine.airspace().findVisible(ssid);
    Bytes record = network ? bssRecord(*network) : bssRecordOfSsid(ssid);
    setIsHs20(record, unsignedOf(action, "isHs20", kYes));
    return postHotspotMessage(machine, hotspotMessage(HotspotEvent::UserDisconnected, record));
}

Ticket runSessionChange(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    std::function<void(Bytes&)> change;
    if (action.isMember("session")) {
        change = [&machine, session = readSessionState(memberOf(action, "session"))](Bytes&) {
            machine.setSession(session);
        };
    }
    return postHotspotMessage(machine,
                              hotspotMessage(HotspotEvent::SessionChanged, action["eventType"].asUInt(),
                                             unsignedOf(action, "sessionId", 0)),
                              std::move(change));
}

Ticket runDriverState(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return postHotspotMessage(machine, hotspotMessage(HotspotEvent::DriverState, action["current"].asUInt(),
                                                      action["previous"].asUInt()));
}

}  // namespace vexa::simulation
