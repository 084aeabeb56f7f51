#include "client/port/HotspotPort.h"

#include <algorithm>

#include "client/port/JsonLine.h"

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

constexpr const char* kCheckCommand = "GET_IS_CARD_IN";
constexpr const char* kCardOut = "CARD_PLUG_OUT";
constexpr const char* kSource = "HotSpot20";

// How long a command may stay without an event before we ask whether the service has gone past it.
constexpr milliseconds kFirstCheck{200};
// The answer to another client's question looks like the answer to ours. He would have to ask twice at the
// very moment, ahead of our command, to mislead us.
constexpr int kChecks = 2;
constexpr milliseconds kStartLimit{5000};
constexpr milliseconds kGoodbyeLimit{2000};

/// An adapter that comes or goes makes the same event, from another source.
bool isCheckAnswer(const Event& event) {
    return event.source == kSource && (event.id == kCardIn || event.id == kCardOut);
}

std::string silenceText(milliseconds limit) {
    return "the service did not answer within " +
           std::to_string(std::chrono::ceil<std::chrono::seconds>(limit).count()) + " s";
}

}  // namespace

HotspotPort::HotspotPort(std::uint16_t port, Signals& signals, milliseconds limit)
    : m_client(port), m_loop(signals), m_limit(limit) {}

HotspotPort::Answer HotspotPort::ask(const std::string& command, const std::optional<std::string>& data,
                                     const std::string& event, const Accepts& accepts) {
    tell(command, data);
    const Deadline end = Deadline::in(m_limit);
    Deadline wake = std::min(end, Deadline::in(kFirstCheck));
    Answer answer;
    // What is still owed for an earlier question tells nothing about this one.
    int stale = m_checksOwed;
    int asked = 0;
    int answered = 0;
    const auto checkNow = [&] {
        check();
        ++asked;
        wake = end;
    };
    while (answered < kChecks) {
        const auto told = next(wake);
        if (!told) {
            if (end.isOver()) throw NoAnswer(silenceText(m_limit));
            checkNow();
        } else if (told->id == event) {
            answer.payload = parseJson(told->data).value_or(Json::Value());
            if (accepts(*answer.payload)) {
                answer.isAccepted = true;
                return answer;
            }
            if (asked == 0) checkNow();
        } else if (isCheckAnswer(*told) && m_checksOwed > 0) {
            --m_checksOwed;
            if (stale > 0) {
                --stale;
                continue;
            }
            answer.cardIn = told->id == kCardIn;
            if (++answered < kChecks) checkNow();
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
    const Deadline end = Deadline::in(m_limit);
    check();
    while (const auto told = next(end)) {
        if (isCheckAnswer(*told) && --m_checksOwed == 0) return told->id == kCardIn;
    }
    throw NoAnswer(silenceText(m_limit));
}

void HotspotPort::check() {
    tell(kCheckCommand);
    ++m_checksOwed;
}

void HotspotPort::tell(const std::string& command, const std::optional<std::string>& data) {
    m_client.send(commandText(command, data));
}

std::optional<Event> HotspotPort::next(Deadline deadline) {
    while (true) {
        while (const auto text = m_client.take()) {
            if (auto event = parseEvent(*text)) return event;
        }
        if (!m_client.isOpen()) throw NoAnswer("the service has closed the connection");
        if (deadline.isOver()) return std::nullopt;
        if (!m_loop.wait(m_client.polled(), deadline))
            throw StoppedByUser("stopped before the service had answered");
        m_client.process();
    }
}

void HotspotPort::close() {
    m_client.close(kGoodbyeLimit);
}

bool acceptsAny(const Json::Value& /*payload*/) {
    return true;
}

}  // namespace vexa::client
