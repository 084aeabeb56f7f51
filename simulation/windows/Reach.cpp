// The simulated WLAN service in a process of Windows has the service's threads, clock and files before it,
// not below it.

#include "simulation/scenario/Reach.h"

#include <span>
#include <string_view>

#include "simulation/scenario/FileCalls.h"
#include "text/OneOf.h"

namespace vexa::simulation {

namespace {

constexpr std::string_view kActionsOnTime[] = {"advance", "shiftTime"};

bool isText(const Json::Value& name, std::span<const std::string_view> known) {
    return name.isString() && isOneOf(known, name.asString());
}

}  // namespace

void checkReach(const JsonPlace& action) {
    const JsonPlace name = action.member("do");
    if (isText(name.value(), kActionsOnTime))
        name.fail("the service has the clock of Windows, which stays as it is");
    if (name.value() == "fail" && isText(action.value()["call"], kFileCalls))
        action.member("call").fail("the service has the files of Windows, which don't fail on request");
}

void checkReach(const Scenario& scenario) {
    if (scenario.speed != 1.0) throw JsonFault("speed: only 1, since the service has the clock of Windows");
}

}  // namespace vexa::simulation
