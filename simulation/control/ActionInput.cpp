#include "simulation/control/ActionInput.h"

namespace vexa::simulation {

JsonPlace memberOf(const Json::Value& action, const char* name) {
    return JsonPlace(action, "").member(name);
}

std::uint32_t unsignedOf(const Json::Value& action, const char* name, std::uint32_t otherwise) {
    return action.isMember(name) ? action[name].asUInt() : otherwise;
}

Bytes bytesOfText(const Json::Value& action, const char* name) {
    const std::string text = action[name].asString();
    return {text.begin(), text.end()};
}

Bytes dataOf(const Json::Value& action) {
    return action.isMember("dataHex") ? memberOf(action, "dataHex").hex() : Bytes{};
}

std::size_t existingAdapterOf(Machine& machine, const Json::Value& action) {
    const std::size_t index = unsignedOf(action, "adapter", 0);
    if (index >= machine.adapters().count()) throw JsonFault("adapter: no such adapter");
    return index;
}

Network existingNetworkOf(Machine& machine, const Json::Value& action) {
    const JsonPlace bssid = memberOf(action, "bssid");
    const auto network = machine.airspace().find(bssid.macAddress());
    if (!network) bssid.fail("no such network");
    return *network;
}

GUID usualGuid(Machine& machine) {
    const auto index = machine.adapters().usual();
    return index ? machine.adapters().guid(*index) : GUID{};
}

GUID guidOf(Machine& machine, const Json::Value& action) {
    return action.isMember("guid") ? memberOf(action, "guid").guid() : usualGuid(machine);
}

}  // namespace vexa::simulation
