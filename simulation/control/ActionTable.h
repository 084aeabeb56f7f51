#pragma once

#include <json/value.h>

#include "simulation/parts/NotificationQueue.h"

namespace vexa::simulation {

class Machine;

/// Who asks for an action. The timeline can't wait for what it has to deliver itself.
enum class Asker { Client, Timeline };

/// Carries an action out, and gives the ticket of its last notification. Throws JsonFault if it is none, or
/// can't be done as things are.
Ticket runAction(Machine& machine, const Json::Value& message, Asker asker);

}  // namespace vexa::simulation
