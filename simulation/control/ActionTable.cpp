#include "simulation/control/ActionTable.h"

#include "simulation/Machine.h"
#include "simulation/control/Actions.h"
#include "simulation/scenario/ActionForms.h"

namespace vexa::simulation {

Ticket runAction(Machine& machine, const Json::Value& message, Asker asker) {
    switch (checkAction(JsonPlace(message, ""), machine.adapters().count())) {
        case ActionId::Radio:
            return runRadio(machine, message, asker);
        case ActionId::PullAdapter:
            return runPullAdapter(machine, message, asker);
        case ActionId::InsertAdapter:
            return runInsertAdapter(machine, message, asker);
        case ActionId::Show:
            return runShow(machine, message, asker);
        case ActionId::Hide:
            return runHide(machine, message, asker);
        case ActionId::AddNetwork:
            return runAddNetwork(machine, message, asker);
        case ActionId::SetNetwork:
            return runSetNetwork(machine, message, asker);
        case ActionId::ReportNetworks:
            return runReportNetworks(machine, message, asker);
        case ActionId::ReportAnqp:
            return runReportAnqp(machine, message, asker);
        case ActionId::CompleteAnqpQuery:
            return runCompleteAnqpQuery(machine, message, asker);
        case ActionId::UserDisconnect:
            return runUserDisconnect(machine, message, asker);
        case ActionId::SessionChange:
            return runSessionChange(machine, message, asker);
        case ActionId::SetSession:
            return runSetSession(machine, message, asker);
        case ActionId::DriverState:
            return runDriverState(machine, message, asker);
        case ActionId::OsConnect:
            return runOsConnect(machine, message, asker);
        case ActionId::DropConnection:
            return runDropConnection(machine, message, asker);
        case ActionId::Connection:
            return runConnection(machine, message, asker);
        case ActionId::Roam:
            return runRoam(machine, message, asker);
        case ActionId::SetDns:
            return runSetDns(machine, message, asker);
        case ActionId::SetRegistry:
            return runSetRegistry(machine, message, asker);
        case ActionId::Set:
            return runSet(machine, message, asker);
        case ActionId::InterfaceState:
            return runInterfaceState(machine, message, asker);
        case ActionId::Fail:
            return runFail(machine, message, asker);
        case ActionId::Reply:
            return runReply(machine, message, asker);
        case ActionId::Levels:
            return runLevels(machine, message, asker);
        case ActionId::Notify:
            return runNotify(machine, message, asker);
        case ActionId::Ihv:
            return runIhv(machine, message, asker);
        case ActionId::Advance:
            return runAdvance(machine, message, asker);
        case ActionId::ShiftTime:
            return runShiftTime(machine, message, asker);
        case ActionId::ClearCalls:
            return runClearCalls(machine, message, asker);
    }
    return 0;
}

}  // namespace vexa::simulation
