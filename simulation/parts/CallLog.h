#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <vector>

#include "platform/Clock.h"
#include "platform/Mutex.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

/// One request to the WLAN service that testers can look at.
struct Call {
    std::string name;
    platform::Duration at{};
    std::uint32_t result = 0;
    Json::Value details;     ///< The members that only this kind of request has.
    bool onlyInAll = false;  ///< A query: asked for so often that it is only shown on demand.
};

/// The requests since the start or the last clear(). Any thread.
class CallLog {
public:
    void add(Call call);
    void clear();
    Json::Value list(bool all) const;

private:
    mutable platform::Mutex m_mutex;
    std::vector<Call> m_calls GUARDED_BY(m_mutex);
};

}  // namespace vexa::simulation
