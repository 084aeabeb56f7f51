#pragma once

#include "simulation/control/ActionTable.h"

namespace vexa::simulation {

// What the actions do. Each is given an action whose members have been checked.

Ticket runRadio(Machine& machine, const Json::Value& action, Asker asker);
Ticket runPullAdapter(Machine& machine, const Json::Value& action, Asker asker);
Ticket runInsertAdapter(Machine& machine, const Json::Value& action, Asker asker);
Ticket runShow(Machine& machine, const Json::Value& action, Asker asker);
Ticket runHide(Machine& machine, const Json::Value& action, Asker asker);
Ticket runAddNetwork(Machine& machine, const Json::Value& action, Asker asker);
Ticket runSetNetwork(Machine& machine, const Json::Value& action, Asker asker);
Ticket runReportNetworks(Machine& machine, const Json::Value& action, Asker asker);
Ticket runReportAnqp(Machine& machine, const Json::Value& action, Asker asker);
Ticket runCompleteAnqpQuery(Machine& machine, const Json::Value& action, Asker asker);
Ticket runUserDisconnect(Machine& machine, const Json::Value& action, Asker asker);
Ticket runSessionChange(Machine& machine, const Json::Value& action, Asker asker);
Ticket runDriverState(Machine& machine, const Json::Value& action, Asker asker);
Ticket runSetSession(Machine& machine, const Json::Value& action, Asker asker);
Ticket runConnection(Machine& machine, const Json::Value& action, Asker asker);
Ticket runOsConnect(Machine& machine, const Json::Value& action, Asker asker);
Ticket runDropConnection(Machine& machine, const Json::Value& action, Asker asker);
Ticket runRoam(Machine& machine, const Json::Value& action, Asker asker);
Ticket runSetDns(Machine& machine, const Json::Value& action, Asker asker);
Ticket runSetRegistry(Machine& machine, const Json::Value& action, Asker asker);
Ticket runSet(Machine& machine, const Json::Value& action, Asker asker);
Ticket runInterfaceState(Machine& machine, const Json::Value& action, Asker asker);
Ticket runFail(Machine& machine, const Json::Value& action, Asker asker);
Ticket runReply(Machine& machine, const Json::Value& action, Asker asker);
Ticket runLevels(Machine& machine, const Json::Value& action, Asker asker);
Ticket runNotify(Machine& machine, const Json::Value& action, Asker asker);
Ticket runIhv(Machine& machine, const Json::Value& action, Asker asker);
Ticket runAdvance(Machine& machine, const Json::Value& action, Asker asker);
Ticket runShiftTime(Machine& machine, const Json::Value& action, Asker asker);
Ticket runClearCalls(Machine& machine, const Json::Value& action, Asker asker);

}  // namespace vexa::simulation
