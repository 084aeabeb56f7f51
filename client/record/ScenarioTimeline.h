#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/record/Recording.h"

namespace vexa::client {

/// The actions of a scenario, each with its time.
class ScenarioTimeline {
public:
    /// An action of this name; members can be added to what is given, until the next one is added.
    Json::Value& add(RecordedTime at, const char* action) {
        Json::Value entry(Json::objectValue);
        entry["atMs"] = static_cast<Json::Int64>(at.count());
        entry["do"] = action;
        return m_actions.append(entry);
    }

    const Json::Value& actions() const { return m_actions; }

private:
    Json::Value m_actions{Json::arrayValue};
};

/// What a scenario is not sure of, a sentence each, in the order in which it came up.
using ScenarioNotes = std::vector<std::string>;

}  // namespace vexa::client
