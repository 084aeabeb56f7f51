#include "client/hotspot/ConnectionWait.h"

#include <algorithm>
#include <array>

#include "client/hotspot/HotspotQuestions.h"
#include "client/terminal/Text.h"
#include "client/terminal/WaitNotice.h"
#include "contract/Ports.h"

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

// Some outcomes are told by nothing but the list.
constexpr milliseconds kBetweenLooks{1000};

void ask(HotspotPort& port, ConnectionJudge& judge) {
    for (const char* question : judge.takeQuestions())
        port.tell(question);
}

struct Reason {
    Outcome outcome;
    bool isOfNetwork;
    const char* text;
};
constexpr std::array kReasons{Reason{Outcome::NotStarted, false, "the service could not begin to join "},
                              Reason{Outcome::OutOfRange, true, " is out of range"},
                              Reason{Outcome::Overtaken, true, ": another network was joined instead"},
                              Reason{Outcome::RadioOff, true, ": the radio was turned off"},
                              Reason{Outcome::AdapterOut, true, ": the adapter was taken out"}};

}  // namespace

Outcome awaitOutcome(HotspotPort& port, ConnectionJudge& judge, milliseconds limit) try {
    WaitNotice notice(judge.waitedFor());
    const Deadline end = Deadline::in(limit);
    Deadline nextLook = Deadline::in(kBetweenLooks);
    ask(port, judge);
    while (true) {
        const auto event = port.next(std::min({end, nextLook, notice.due()}));
        notice.tick();
        if (event) {
            const Outcome outcome = judge.apply(*event, Deadline::Clock::now());
            if (outcome != Outcome::Open) return outcome;
            ask(port, judge);
        }
        if (end.isOver()) return Outcome::Open;
        if (!nextLook.isOver()) continue;
        if (judge.wantsLists()) port.tell(contract::kGetAllNetworkList);
        nextLook = Deadline::in(kBetweenLooks);
    }
} catch (const StoppedByUser&) {
    throw StoppedByUser("not waited for: the service goes on with it");
}

std::string reasonOf(Outcome outcome, const std::string& network) {
    for (const Reason& reason : kReasons) {
        if (reason.outcome == outcome)
            return reason.isOfNetwork ? inQuotes(network) + reason.text : reason.text + inQuotes(network);
    }
    return {};
}

}  // namespace vexa::client
