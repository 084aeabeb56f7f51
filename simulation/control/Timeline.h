#pragma once

namespace vexa::simulation {

class Machine;

/// Begins the timeline of the machine's scenario: what is due at 0 has been done when this returns. Once for
/// a machine, before anything else is asked of it.
void beginTimeline(Machine& machine);

}  // namespace vexa::simulation
