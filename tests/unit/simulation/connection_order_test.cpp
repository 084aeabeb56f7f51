#include <gtest/gtest.h>

#include <algorithm>
#include <random>

#include "Station.h"

namespace vexa::simulation {
namespace {

constexpr const char* kScenario =
    "{'networks': ["
    "{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe', 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:02', 'ssid': 'Bar', 'osProfile': true}]}";

constexpr const char* kActs[] = {
    "{'do': 'hide', 'bssid': '02:00:00:00:00:01'}",
    "{'do': 'show', 'bssid': '02:00:00:00:00:01'}",
    "{'do': 'radio', 'software': 'off'}",
    "{'do': 'radio', 'software': 'on'}",
    "{'do': 'pullAdapter'}",
    "{'do': 'insertAdapter'}",
    "{'do': 'osConnect', 'ssid': 'Cafe'}",
    "{'do': 'osConnect', 'ssid': 'Bar', 'succeeds': false}",
    "{'do': 'dropConnection'}",
    "{'do': 'set', 'connectMs': 50}",
};

/// Follows the notifications and says what can't be: a result without a beginning, a second beginning, a
/// connection on an adapter that is gone, a state that a query contradicts.
class Watcher {
public:
    void see(const std::string& line) {
        const std::string code = line.substr(0, line.find(' '));
        const bool hasReason = std::count(line.begin(), line.end(), ' ') == 3;
        if (code == "8/9") return move("idle", "trying", line);
        if (code == "8/10") return move("trying", hasReason ? "cancelled" : "joined", line);
        if (code == "8/21" && m_state == "cancelled") return move("cancelled", "idle", line);
        if (code == "8/21") return move("joined", "idle", line);
        if (code == "8/14" && m_state != "cancelled") return move("idle", "idle", line);
        if (code == "8/20") expect("joined", line);
    }

    void settle(const std::string& state) {
        EXPECT_EQ(state == "connected", m_state == "joined") << m_history;
        EXPECT_EQ(state == "associating", m_state == "trying") << m_history;
    }

    void note(const std::string& what) { m_history += what + "\n"; }

private:
    void expect(const std::string& state, const std::string& line) {
        // What was cancelled may be followed by its end, or by anything that can follow nothing.
        if (m_state == "cancelled" && state == "idle") m_state = "idle";
        EXPECT_EQ(m_state, state) << m_history << line;
    }

    void move(const std::string& from, const std::string& to, const std::string& line) {
        expect(from, line);
        m_state = to;
    }

    std::string m_state = "idle";
    std::string m_history;
};

// Requests may be refused: the radio is off, or the adapter gone.
void doSomething(Station& station, std::mt19937& random, Watcher& watcher) {
    constexpr std::size_t kRequests = 4;
    const std::size_t choice = random() % (std::size(kActs) + kRequests);
    watcher.note("step " + std::to_string(choice));
    if (choice < std::size(kActs)) return station.act(kActs[choice]);
    const std::size_t request = choice - std::size(kActs);
    if (request == 0) station.connect(ttlsProfile("Cafe", "43616665"));
    if (request == 1) station.connect(tlsProfile("Cafe", "43616665", "ca", "machine"));
    if (request == 2) station.discover("Bar");
    if (request == 3) station.disconnect();
}

TEST(ConnectionOrder, WhateverHappensEachAttemptHasOneEndAndEachConnectionToo) {
    for (std::uint32_t seed = 0; seed < 60; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        std::mt19937 random(seed);
        Station station(kScenario);
        Watcher watcher;
        for (int step = 0; step < 80; ++step) {
            // Often several requests before anything has been told.
            do {
                doSomething(station, random, watcher);
            } while (random() % 3 == 0);
            station.machine.advance(static_cast<int>(random() % 3 * 60));
            for (const std::string& line : station.told()) {
                watcher.note(line);
                watcher.see(line);
            }
            watcher.settle(station.state());
            if (::testing::Test::HasFailure()) return;
        }
    }
}

}  // namespace
}  // namespace vexa::simulation
