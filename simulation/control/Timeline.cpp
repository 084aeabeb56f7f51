#include "simulation/control/Timeline.h"

#include <iostream>
#include <string>

#include "simulation/Machine.h"
#include "simulation/control/ActionTable.h"
#include "simulation/scenario/JsonPlace.h"

namespace vexa::simulation {

namespace {

// Nobody waits for the answer; a line on standard error is all there is to tell.
void performEntry(Machine& machine, const Json::Value& action) {
    try {
        runAction(machine, action, Asker::Timeline);
    } catch (const JsonFault& fault) {
        std::cerr << "timeline: " + std::string(fault.what()) + "\n";
    }
}

}  // namespace

void beginTimeline(Machine& machine) {
    for (const TimelineEntry& entry : machine.scenario().timeline) {
        if (entry.at > platform::Duration::zero()) {
            machine.agenda().add(machine.start() + entry.at,
                                 [&machine, &entry] { performEntry(machine, entry.action); });
        } else {
            performEntry(machine, entry.action);
        }
    }
    machine.notifications().waitDelivered(machine.notifications().post({}));
}

}  // namespace vexa::simulation
