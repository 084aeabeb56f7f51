#include "simulation/control/Queries.h"

#include <algorithm>
#include <array>

#include "simulation/Machine.h"

namespace vexa::simulation {

namespace {

constexpr std::array<const char*, 8> kInterfaceStates = {
    "not_ready",    "connected",   "ad_hoc_network_formed", "disconnecting",
    "disconnected", "associating", "discovering",           "authenticating"};
constexpr std::array<const char*, 3> kRadioStates = {"unknown", "on", "off"};

Json::Value queryCalls(Machine& machine, const Json::Value& message) {
    return machine.calls().list(message["all"].asBool());
}

Json::Value queryInterface(Machine& machine, const Json::Value& /*message*/) {
    const std::size_t adapter = machine.usualAdapter();
    const RadioState radio = machine.adapters().radio(adapter);
    Json::Value result;
    result["state"] = kInterfaceStates.at(static_cast<std::size_t>(machine.interfaceState(adapter)));
    const Link link = machine.connections().shown(adapter);
    result["ssid"] = isUp(link) ? Json::Value(textOfBytes(link.ssid)) : Json::Value();
    result["radio"]["hardware"] = kRadioStates.at(static_cast<std::size_t>(radio.hardware));
    result["radio"]["software"] = kRadioStates.at(static_cast<std::size_t>(radio.software));
    return result;
}

Json::Value queryHandles(Machine& machine, const Json::Value& /*message*/) {
    return Json::UInt64{machine.handles().count()};
}

Json::Value queryRegistry(Machine& machine, const Json::Value& /*message*/) {
    return machine.registry().content();
}

Json::Value queryTime(Machine& machine, const Json::Value& /*message*/) {
    using std::chrono::milliseconds;
    Json::Value result;
    result["ms"] = Json::Int64{std::chrono::duration_cast<milliseconds>(machine.elapsed()).count()};
    return result;
}

struct Query {
    std::string_view name;
    Json::Value (*run)(Machine& machine, const Json::Value& message);
    std::string_view flag = {};  ///< The one boolean member that it may have.
};

constexpr Query kQueries[] = {
    {"calls", queryCalls, "all"}, {"interface", queryInterface}, {"handles", queryHandles},
    {"registry", queryRegistry},  {"time", queryTime},
};

}  // namespace

Json::Value runQuery(Machine& machine, const Json::Value& message) {
    const JsonPlace place(message, "");
    const JsonPlace name = place.member("query");
    const std::string text = name.text();
    const auto* query = std::find_if(std::begin(kQueries), std::end(kQueries),
                                     [&](const Query& candidate) { return candidate.name == text; });
    if (query == std::end(kQueries)) name.fail("unknown query " + text);
    for (const auto& [member, value] : place.members()) {
        if (member == "query") continue;
        if (query->flag.empty() || member != query->flag) value.fail("unknown member");
        value.flag();
    }
    return query->run(machine, message);
}

}  // namespace vexa::simulation
