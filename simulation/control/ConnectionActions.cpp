// Actions on connections.

#include "simulation/control/ActionInput.h"
#include "simulation/control/Actions.h"
#include "simulation/parts/ReasonTexts.h"

namespace vexa::simulation {

Ticket runConnection(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    Link link;
    link.mode = wlan_connection_mode_temporary_profile;
    link.profileName = utf16(action["profileName"].asString());
    if (link.profileName.size() >= WLAN_MAX_NAME_LENGTH)
        memberOf(action, "profileName").fail("more than 255 characters");
    if (action.isMember("ssidHex")) link.ssid = memberOf(action, "ssidHex").hex();
    if (link.ssid.size() > DOT11_SSID_MAX_LENGTH) memberOf(action, "ssidHex").fail("more than 32 bytes");
    return machine.notifications().post(
        {WLAN_NOTIFICATION_SOURCE_ACM, action["code"].asUInt(), usualGuid(machine),
         connectionMessage(link, unsignedOf(action, "reason", kSucceeded)), nullptr});
}

Ticket runOsConnect(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    ConnectionWish wish = wishFor(wlan_connection_mode_auto, bytesOfText(action, "ssid"));
    wish.succeeds = !action.isMember("succeeds") || action["succeeds"].asBool();
    return machine.connections().connectBySystem(machine.usualAdapter(), std::move(wish));
}

Ticket runDropConnection(Machine& machine, const Json::Value& action, Asker /*asker*/) {
    return machine.connections().drop(unsignedOf(action, "reason", kConnectionLost));
}

}  // namespace vexa::simulation
