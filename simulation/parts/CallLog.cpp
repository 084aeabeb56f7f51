#include "simulation/parts/CallLog.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

void CallLog::add(Call call) {
    const LockGuard<Mutex> lock(m_mutex);
    m_calls.push_back(std::move(call));
}

void CallLog::clear() {
    const LockGuard<Mutex> lock(m_mutex);
    m_calls.clear();
}

Json::Value CallLog::list(bool all) const {
    const LockGuard<Mutex> lock(m_mutex);
    Json::Value list(Json::arrayValue);
    for (const Call& call : m_calls) {
        if (call.onlyInAll && !all) continue;
        Json::Value entry = call.details;
        entry["call"] = call.name;
        entry["atMs"] = Json::Int64{std::chrono::duration_cast<std::chrono::milliseconds>(call.at).count()};
        entry["result"] = call.result;
        list.append(std::move(entry));
    }
    return list;
}

}  // namespace vexa::simulation
