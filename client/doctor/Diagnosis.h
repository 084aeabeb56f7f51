#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/doctor/Observations.h"

namespace vexa::client {

/// One gate on the way to a connection.
struct Finding {
    enum class State { Fine, InTheWay, NotKnown };

    std::string gate;
    State state = State::Fine;
    std::string seen;
    /// What to do about it; empty if there is nothing to do.
    std::string advice = {};
};

/// All gates in the order in which the service comes to them. With a connection there, what would keep the
/// service from another one is in nobody's way.
std::vector<Finding> diagnose(const Observations& seen);

/// The gates that are in the way: "radio, networks"; empty for none.
std::string namesInTheWay(const std::vector<Finding>& findings);

/// No gate is left out for want of knowledge.
bool isAllKnown(const std::vector<Finding>& findings);

/// A line for each, with another one for what to do; a reason for not knowing is told once. Lines have no
/// line end.
std::vector<std::string> diagnosisLines(const std::vector<Finding>& findings);

Json::Value diagnosisJson(const std::vector<Finding>& findings);

}  // namespace vexa::client
