#pragma once

#include <json/value.h>

#include <cstddef>
#include <span>
#include <string_view>

#include "platform/Clock.h"
#include "simulation/JsonPlace.h"
#include "simulation/NotificationQueue.h"
#include "simulation/Scenario.h"

namespace vexa::simulation {

class Machine;

/// Who asks for an action. The timeline can't wait for what it has to deliver itself.
enum class Asker { Client, Timeline };

/// Carries an action out that has been checked, and gives the ticket of its last notification. Throws
/// JsonFault if it can't be done as things are.
using ActionRun = Ticket (*)(Machine& machine, const Json::Value& action, Asker asker);

struct ActionMember {
    std::string_view name;
    void (*check)(const JsonPlace& place, std::size_t adapterCount);
    Needed needed = Needed::No;
};

struct Action {
    std::string_view name;
    std::span<const ActionMember> members;
    ActionRun run = nullptr;
    void (*checkWhole)(const JsonPlace& place) = nullptr;  ///< What concerns several members.
    bool anyMembers = false;                               ///< checkWhole looks at the members itself.
};

/// The action that `place` holds, all its members checked. Throws JsonFault.
const Action& checkAction(const JsonPlace& place, std::size_t adapterCount);

/// The action of an entry of the timeline, checked, without its time, which goes to `at`.
Json::Value timelineAction(const JsonPlace& place, std::size_t adapterCount, platform::Duration& at);

SessionState readSessionState(const JsonPlace& place);

}  // namespace vexa::simulation
