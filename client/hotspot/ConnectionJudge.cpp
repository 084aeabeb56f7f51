#include "client/hotspot/ConnectionJudge.h"

#include <algorithm>
#include <utility>

#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

// A connection that nothing was told of counts once it was seen so long; so does a network that is missing.
constexpr std::chrono::milliseconds kSettled{900};

bool hasLasted(std::optional<ConnectionJudge::Time>& since, ConnectionJudge::Time now) {
    if (!since) since = now;
    return now - *since >= kSettled;
}

}  // namespace

ConnectionJudge::ConnectionJudge(std::string network) : m_network(std::move(network)) {
    check();
}

void ConnectionJudge::check() {
    m_questions.push_back(Checkpoints::kQuestion);
    m_checkpoints.ask();
}

std::vector<const char*> ConnectionJudge::takeQuestions() {
    return std::exchange(m_questions, {});
}

// The service tells of the end of an attempt, of the internet then, and sends no list in between: a list that
// comes behind a result knows what kind of result it was.
Outcome ConnectionJudge::apply(const Event& event, Time now) {
    const Json::Value payload = payloadOf(event);
    if (event.id == contract::kCardPlugOut) return Outcome::AdapterOut;
    if (m_checkpoints.take(event) && !m_checkpoints.isPassed()) check();
    if (event.id == contract::kGetRadio && payload == Json::Value(false)) return Outcome::RadioOff;
    if (event.id == contract::kConnectDisconnect) {
        m_results.push_back({payload == Json::Value(1), m_checkpoints.isPassed(), false});
        if (wantsLists()) m_questions.push_back(contract::kGetAllNetworkList);
    } else if (event.id == contract::kGetIsInternetAccess && !m_results.empty()) {
        m_results.back().isReport = true;
    } else if (event.id == contract::kGetAllNetworkList) {
        return judge(networkList(payload), std::exchange(m_results, {}), now);
    }
    return Outcome::Open;
}

std::string JoinJudge::waitedFor() const {
    return inQuotes(network()) + " to be joined";
}

Outcome JoinJudge::judge(const NetworkList& list, const std::vector<Result>& results, Time now) {
    const Network* const wanted = findNetwork(list, network());
    if (wanted == nullptr || !wanted->isConnected) {
        const Outcome outcome = judgeAbsent(wanted != nullptr, results, now);
        const bool isOver = isOvertaken(connectedNetwork(list), results, now);
        return outcome == Outcome::Open && isOver ? Outcome::Overtaken : outcome;
    }
    m_missingSince.reset();
    const bool isTold =
        std::any_of(results.begin(), results.end(), [](const Result& result) { return result.isSuccess; });
    return hasLasted(m_connectedSince, now) || isTold ? Outcome::Joined : Outcome::Open;
}

// The service keeps one request: that of another client takes the place of one that waits.
bool JoinJudge::isOvertaken(const Network* connected, const std::vector<Result>& results, Time now) {
    m_isOtherTold = connected != nullptr &&
                    (m_isOtherTold || std::any_of(results.begin(), results.end(), [](const Result& result) {
                         return result.isSuccess && result.isBehind;
                     }));
    if (!m_isOtherTold) m_otherSince.reset();
    return m_isOtherTold && hasLasted(m_otherSince, now);
}

Outcome JoinJudge::judgeAbsent(bool isInList, const std::vector<Result>& results, Time now) {
    m_connectedSince.reset();
    if (isInList) m_missingSince.reset();
    for (const Result& result : results) {
        if (const Outcome outcome = judgeFailure(isInList, result); outcome != Outcome::Open) return outcome;
    }
    return !isInList && hasLasted(m_missingSince, now) ? Outcome::OutOfRange : Outcome::Open;
}

// A report that came before the service had come to the request is that of an attempt before. An answer that
// came later is to a request of somebody else, unless the network has gone.
Outcome JoinJudge::judgeFailure(bool isInList, const Result& result) {
    if (result.isSuccess) return Outcome::Open;
    if (result.isReport) return result.isBehind ? Outcome::Refused : Outcome::Open;
    if (!isInList) return Outcome::OutOfRange;
    return result.isBehind ? Outcome::Open : Outcome::NotStarted;
}

std::string LeaveJudge::waitedFor() const {
    return inQuotes(network()) + " to be left";
}

Outcome LeaveJudge::judge(const NetworkList& list, const std::vector<Result>& results, Time /*now*/) {
    const Network* const wanted = findNetwork(list, network());
    if (wanted != nullptr && wanted->isConnected) {
        m_isConnected = true;
        return Outcome::Open;
    }
    if (m_isConnected) return Outcome::Left;
    const bool isTold =
        std::any_of(results.begin(), results.end(), [](const Result& result) { return result.isReport; });
    return isTold ? Outcome::Ended : Outcome::Open;
}

}  // namespace vexa::client
