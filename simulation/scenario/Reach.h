#pragma once

#include "simulation/scenario/JsonPlace.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::simulation {

// What the machine has no hold of depends on where it runs. Asking for it is an error, so that no story
// believes in something that didn't happen.

/// Throws JsonFault if the action, whose members have been checked, would change something out of reach.
void checkReach(const JsonPlace& action);

/// The same for what a scenario begins with.
void checkReach(const Scenario& scenario);

}  // namespace vexa::simulation
