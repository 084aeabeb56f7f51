#include "client/port/Checkpoints.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

// The answer to another client's question looks like the answer to ours. He would have to ask twice at the
// very moment, ahead of our command, to mislead us.
constexpr int kEnough = 2;

/// An adapter that comes or goes makes the same event, from another source.
bool isAnswer(const Event& event) {
    return event.source == contract::kHotspotSource &&
           (event.id == contract::kCardPlugIn || event.id == contract::kCardPlugOut);
}

}  // namespace

void Checkpoints::begin() {
    m_stale = m_owed;
    m_answers = 0;
}

bool Checkpoints::take(const Event& event) {
    if (m_owed == 0 || !isAnswer(event)) return false;
    --m_owed;
    if (m_stale > 0) {
        --m_stale;
        return false;
    }
    ++m_answers;
    return true;
}

bool Checkpoints::isPassed() const {
    return m_answers >= kEnough;
}

}  // namespace vexa::client
