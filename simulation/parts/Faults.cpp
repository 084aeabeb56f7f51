#include "simulation/parts/Faults.h"

#include <algorithm>

#include "simulation/scenario/FileCalls.h"
#include "text/OneOf.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

namespace {

// Files are named by a part of their name, everything else in full.
bool matches(const FailRule& rule, std::string_view call, std::string_view detail) {
    if (rule.call != call) return false;
    if (!rule.match) return true;
    return isOneOf(kFileCalls, call) ? detail.find(*rule.match) != std::string_view::npos
                                     : detail == *rule.match;
}

template <class Rule>
void dropSpent(std::vector<Rule>& rules) {
    rules.erase(std::remove_if(rules.begin(), rules.end(), [](const Rule& rule) { return rule.times == 0; }),
                rules.end());
}

}  // namespace

void Faults::add(FailRule rule) {
    const LockGuard<Mutex> lock(m_mutex);
    m_failRules.push_back(std::move(rule));
}

void Faults::add(ReplyRule rule) {
    const LockGuard<Mutex> lock(m_mutex);
    m_replyRules.push_back(std::move(rule));
}

std::optional<std::uint32_t> Faults::nextError(std::string_view call, std::string_view detail) {
    const LockGuard<Mutex> lock(m_mutex);
    dropSpent(m_failRules);
    std::optional<std::uint32_t> error;
    for (FailRule& rule : m_failRules) {
        if (!matches(rule, call, detail)) continue;
        if (rule.skip > 0) {
            --rule.skip;
        } else if (!error) {
            --rule.times;
            error = rule.error;
        }
    }
    return error;
}

std::optional<Bytes> Faults::nextReply(std::string_view request) {
    const LockGuard<Mutex> lock(m_mutex);
    dropSpent(m_replyRules);
    for (ReplyRule& rule : m_replyRules) {
        if (rule.match != request) continue;
        --rule.times;
        return rule.data;
    }
    return std::nullopt;
}

}  // namespace vexa::simulation
