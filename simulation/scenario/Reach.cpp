#include "simulation/scenario/Reach.h"

namespace vexa::simulation {

// All of the machine is simulated.

void checkReach(const JsonPlace& /*action*/) {}

void checkReach(const Scenario& /*scenario*/) {}

}  // namespace vexa::simulation
