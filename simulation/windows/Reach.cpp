// The simulated WLAN service in a process of Windows has the service's threads, clock and files before it,
// not below it.

#include "simulation/scenario/Reach.h"

#include <algorithm>
#include <span>
#include <string_view>

namespace vexa::simulation {

namespace {

constexpr std::string_view kActionsOnTime[] = {"advance", "shiftTime"};
constexpr std::string_view kCallsOnFiles[] = {"CreateDirectory", "open", "write", "sync", "rename"};

bool contains(std::span<const std::string_view> names, const Json::Value& name) {
    return name.isString() && std::find(names.begin(), names.end(), name.asString()) != names.end();
}

}  // namespace

void checkReach(const JsonPlace& action) {
    const JsonPlace name = action.member("do");
    if (contains(kActionsOnTime, name.value()))
        name.fail("the service has the clock of Windows, which stays as it is");
    if (name.value() == "fail" && contains(kCallsOnFiles, action.value()["call"]))
        action.member("call").fail("the service has the files of Windows, which don't fail on request");
}

void checkReach(const Scenario& scenario) {
    if (scenario.speed != 1.0) throw JsonFault("speed: only 1, since the service has the clock of Windows");
}

}  // namespace vexa::simulation
