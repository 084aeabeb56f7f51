#include "simulation/control/Performance.h"

#include <string>

#include "simulation/Machine.h"
#include "simulation/control/ActionTable.h"
#include "simulation/control/Queries.h"
#include "simulation/scenario/JsonPlace.h"

namespace vexa::simulation {

namespace {

Json::Value refusal(const std::string& error) {
    Json::Value answer;
    answer["ok"] = false;
    answer["error"] = error;
    return answer;
}

}  // namespace

Json::Value perform(Machine& machine, const Json::Value& message) {
    if (!message.isObject()) return refusal("not an object");
    try {
        Json::Value answer;
        answer["ok"] = true;
        if (message.isMember("query") && !message.isMember("do")) {
            answer["result"] = runQuery(machine, message);
        } else {
            machine.notifications().waitDelivered(runAction(machine, message, Asker::Client));
        }
        return answer;
    } catch (const JsonFault& fault) {
        return refusal(fault.what());
    }
}

}  // namespace vexa::simulation
