#include "client/port/HotspotPort.h"
#include "contract/Ports.h"

#include <algorithm>

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

// How long a command may stay without an event before we ask whether the service has gone past it.
constexpr milliseconds kFirstCheck{200};
constexpr milliseconds kStartLimit{5000};
constexpr milliseconds kHandoverLimit{2000};

constexpr const char* kAnswer = "an answer of the service";

std::string silenceText(milliseconds limit) {
    return "the service did not answer within " +
           std::to_string(std::chrono::ceil<std::chrono::seconds>(limit).count()) + " s";
}

}  // namespace

HotspotPort::HotspotPort(std::uint16_t port, Signals& signals, milliseconds limit)
    : m_client(port), m_loop(signals), m_limit(limit) {}

HotspotPort::Answer HotspotPort::ask(const std::string& command, const std::optional<std::string>& data,
                                     const std::string& event, const Accepts& accepts) {
    m_checkpoints.begin();
    tell(command, data);
    const Deadline end = Deadline::in(m_limit);
    Deadline firstCheck = Deadline::in(kFirstCheck);
    Answer answer;
    WaitNotice notice(kAnswer);
    const auto checkNow = [&] {
        sendCheck();
        firstCheck = end;
    };
    while (!m_checkpoints.isPassed()) {
        const auto told = nextAnswer(std::min(end, firstCheck), notice);
        if (!told) {
            if (end.isOver()) throw NoAnswer(silenceText(m_limit));
            checkNow();
        } else if (told->id == event) {
            answer.payload = payloadOf(*told);
            answer.isAccepted = accepts(*answer.payload);
            if (answer.isAccepted) break;
            if (!m_checkpoints.isAsked()) checkNow();
        } else if (m_checkpoints.take(*told)) {
            answer.cardIn = told->id == contract::kCardPlugIn;
            if (!m_checkpoints.isPassed()) checkNow();
        }
    }
    return answer;
}

HotspotPort::Answer HotspotPort::question(const std::string& command, const Accepts& accepts) {
    const Deadline end = Deadline::in(std::min(m_limit, kStartLimit));
    while (true) {
        Answer answer = ask(command, std::nullopt, command, accepts);
        if (answer.payload || !answer.cardIn || end.isOver()) return answer;
    }
}

bool HotspotPort::hasAdapter() {
    m_checkpoints.begin();
    sendCheck();
    const Deadline end = Deadline::in(m_limit);
    WaitNotice notice(kAnswer);
    while (const auto told = nextAnswer(end, notice)) {
        if (m_checkpoints.take(*told)) return told->id == contract::kCardPlugIn;
    }
    throw NoAnswer(silenceText(m_limit));
}

std::optional<Event> HotspotPort::nextAnswer(Deadline deadline, WaitNotice& notice) {
    auto told = next(std::min(deadline, notice.due()));
    if (told || !(notice.due() < deadline)) return told;
    notice.tick();
    return next(deadline);
}

void HotspotPort::sendCheck() {
    tell(Checkpoints::kQuestion);
    m_checkpoints.ask();
}

void HotspotPort::tell(const std::string& command, const std::optional<std::string>& data) {
    m_client.send(commandText(command, data));
}

std::optional<Event> HotspotPort::next(Deadline deadline) {
    while (true) {
        while (const auto text = m_client.take()) {
            if (auto event = parseEvent(*text)) return event;
        }
        m_client.requireOpen();
        if (deadline.isOver()) return std::nullopt;
        if (!m_loop.wait(m_client.polled(), deadline))
            throw StoppedByUser("stopped before the service had answered");
        m_client.process();
    }
}

void HotspotPort::close() {
    m_client.close(kHandoverLimit);
}

bool acceptsAny(const Json::Value& /*payload*/) {
    return true;
}

}  // namespace vexa::client
