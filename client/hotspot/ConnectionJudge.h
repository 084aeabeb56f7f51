#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "client/hotspot/Network.h"
#include "client/port/Checkpoints.h"
#include "client/port/Event.h"

namespace vexa::client {

/// What has come of a request to join a network or to leave it.
enum class Outcome {
    Open,
    Joined,
    Refused,     // every attempt was made and failed
    NotStarted,  // the service could not begin
    Left,
    Ended,  // left before it was joined
    OutOfRange,
    Overtaken,  // another network was joined instead, as somebody else has asked for
    RadioOff,
    AdapterOut
};

/// The part that joining and leaving share: it tells when the service has certainly gone past the request,
/// and what ends everything. No event says whose it is, or which network it means: what is believed is the
/// list of networks, and what comes behind the request. Pure: fed with events and moments.
class ConnectionJudge {
public:
    using Time = std::chrono::steady_clock::time_point;

    explicit ConnectionJudge(std::string network);
    virtual ~ConnectionJudge() = default;
    ConnectionJudge(const ConnectionJudge&) = delete;
    ConnectionJudge& operator=(const ConnectionJudge&) = delete;

    /// Takes in an event.
    Outcome apply(const Event& event, Time now);

    /// The commands that have to be sent now, behind the request, or because of what was applied.
    std::vector<const char*> takeQuestions();

    /// What is waited for, as in "the end of the connection".
    virtual std::string waitedFor() const = 0;

    /// A list of networks, asked for, would tell more.
    virtual bool wantsLists() const = 0;

protected:
    /// A result of an attempt, anybody's. `isBehind`: the service had gone past the request.
    struct Result {
        bool isSuccess;
        bool isBehind;
        /// The report of an attempt; else the answer to a request that could not be begun.
        bool isReport;
    };

    /// Looks at a list, and at the results that came since the list before.
    virtual Outcome judge(const NetworkList& list, const std::vector<Result>& results, Time now) = 0;

    const std::string& network() const { return m_network; }

private:
    void check();

    std::string m_network;
    std::vector<const char*> m_questions;
    Checkpoints m_checkpoints;
    std::vector<Result> m_results;
};

/// Joined when the list marks the network as the connected one, and this is no passing moment; refused when
/// the report of a failed attempt came behind the request; overtaken when a success behind it was another's,
/// and stays.
class JoinJudge : public ConnectionJudge {
public:
    using ConnectionJudge::ConnectionJudge;

    std::string waitedFor() const override;
    bool wantsLists() const override { return true; }

private:
    Outcome judge(const NetworkList& list, const std::vector<Result>& results, Time now) override;
    Outcome judgeAbsent(bool isInList, const std::vector<Result>& results, Time now);
    static Outcome judgeFailure(bool isInList, const Result& result);

    bool isOvertaken(const Network* connected, const std::vector<Result>& results, Time now);

    std::optional<Time> m_connectedSince;
    std::optional<Time> m_missingSince;
    bool m_isOtherTold = false;
    std::optional<Time> m_otherSince;
};

/// Left when the list does not mark the network any more. One that was not yet joined has ended when its
/// failure and the end of its connection were told.
class LeaveJudge : public ConnectionJudge {
public:
    LeaveJudge(std::string network, bool isConnected)
        : ConnectionJudge(std::move(network)), m_isConnected(isConnected) {}

    std::string waitedFor() const override;

    /// The end of a connection brings a list by itself, the failure of an attempt does not.
    bool wantsLists() const override { return m_isConnected; }

private:
    Outcome judge(const NetworkList& list, const std::vector<Result>& results, Time now) override;

    bool m_isConnected;
};

}  // namespace vexa::client
