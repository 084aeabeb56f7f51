#include <gtest/gtest.h>

#include "Station.h"
#include "platform/Session.h"

namespace vexa::simulation {
namespace {

const std::string kHeader = hex("005ec403 00000000");
const std::string kCompleted = kHeader + hex("04000000 00000000");

std::string record(const std::string& bssid, const std::string& ssidHex, const std::string& numbers) {
    return bssid + ssidHex + zeros(34 - ssidHex.size() / 2) + hex(numbers);
}

const std::string kCafe = record("020000000001", "43616665", "01000000 02000000 01000000");

std::string network(const std::string& number, const std::string& more) {
    return "{'bssid': '02:00:00:00:00:" + number + "', 'ssid': 'Cafe'" + more + "}";
}

/// The client's side of the module.
class Air : public Station {
public:
    explicit Air(const std::string& networks) : Station("{'networks': [" + networks + "]}") {}

    DWORD send(const std::string& request, DWORD capacity) {
        return control(wlan_ihv_control_type_service, *bytesFromHex(request), capacity);
    }

    std::string bssList(DWORD capacity = 10240) {
        EXPECT_EQ(send(kHeader + "05000000" + zeros(8), capacity), ERROR_SUCCESS);
        return hexText(output);
    }

    std::string anqp(const std::string& bssid) {
        EXPECT_EQ(send(kHeader + "0800000034000000" + bssid + zeros(46), 10240), ERROR_SUCCESS);
        return hexText(output);
    }

    void query() { EXPECT_EQ(send(kHeader + "03000000" + zeros(8), 0), ERROR_SUCCESS); }
};

TEST(HotspotModule, TheListHoldsTheVisibleReportedNetworksInOrderAsFarAsTheyFit) {
    const std::string ssid = "00ff" + std::string(60, '1');
    Air air(network("01", "") + "," + network("02", ", 'visible': false") + "," +
            network("03", ", 'reported': false") + ",{'bssid': '0a:Bc:00:00:00:04', 'ssidHex': '" + ssid +
            "', 'hs20': false, 'networkType': 7, 'internetAccess': 0}");
    const std::string list = kCafe + record("0abc00000004", ssid, "00000000 07000000 00000000");
    for (const DWORD capacity : {0U, 51U, 52U, 103U, 104U, 10240U})
        EXPECT_EQ(air.bssList(capacity), list.substr(0, capacity / 52 * 104)) << capacity;
    air.act("{'do': 'reportNetworks'}");
    EXPECT_EQ(air.blocks(), Texts{kHeader + "0200000068000000" + list});
}

TEST(HotspotModule, RequestsOfAnotherFormOrToAnotherAdapterAreRefused) {
    Air air("");
    const std::string requests[] = {
        kHeader + "05000000" + zeros(4),                // too short
        kHeader + "05000000" + zeros(9),                // too long
        kHeader + "0500000004000000" + zeros(4),        // a payload that the list doesn't have
        "005ec403010000000500000000000000" + zeros(4),  // reserved
        kHeader + "0800000034000000" + zeros(51),       // a record too short
        kHeader + "0800000000000000" + zeros(52),       // no length
        kHeader + "04000000" + zeros(8),                // no such request
        "015ec403000000000500000000000000" + zeros(4),  // another signature
    };
    for (const std::string& request : requests)
        EXPECT_EQ(air.send(request, 100), ERROR_INVALID_PARAMETER) << request;
    EXPECT_EQ(air.bssList(), "");
}

TEST(HotspotModule, TheRealmListIsBuiltAsTheNetworkGivesItLast) {
    const std::pair<std::string, std::string> cases[] = {
        {"'visible': true", "00000000"},
        {"'realms': []", "02000000 0000"},
        {"'naiRealmHex': 'FfEe01'", "03000000 ffee01"},
        {"'realms': [{'names': ['a.b', 'c'], 'eapMethods': [13, 255]}, {}]",
         "17000000 0200 0e00 00 05 612e623b63 02 020d00 02ff00 0300 00 00 00"},
        {"'naiRealmHex': ''", "00000000"},
    };
    Air air(network("01", ""));
    for (const auto& [member, info] : cases) {
        air.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', " + member + "}");
        EXPECT_EQ(air.anqp("020000000001"), hex(info)) << member;
    }
    air.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'naiRealmHex': '" + zeros(10237) + "'}");
    EXPECT_EQ(air.send(kHeader + "0800000034000000" + "020000000001" + zeros(46), 10240),
              ERROR_INSUFFICIENT_BUFFER);
}

TEST(HotspotModule, ANetworkWithoutAnAnswerYetGivesNothing) {
    Air air(network("01", "") + "," + network("02", ", 'anqp': 'onQuery'") + "," +
            network("03", ", 'anqp': 'never'") + "," + network("04", ", 'reported': false"));
    const auto answers = [&] {
        std::string out;
        for (const char* bssid :
             {"020000000001", "020000000002", "020000000003", "020000000004", "0a0000000000"})
            out += air.anqp(bssid).empty() ? "-" : "+";
        return out;
    };
    std::string during;
    air.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { during = answers(); };
    EXPECT_EQ(answers(), "+----");
    air.query();
    air.machine.advance(199);
    EXPECT_EQ(answers(), "+----");
    air.machine.advance(1);
    EXPECT_EQ(during, "++---");
    air.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:02', 'anqp': 'onQuery'}");
    EXPECT_EQ(answers(), "+----");
    air.act("{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:02'}");
    air.act("{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:03'}");
    EXPECT_EQ(during, "++---");
}

TEST(HotspotModule, EachQueryHasItsOwnCompletion) {
    Air air("");
    const auto expectCompletions = [&](std::initializer_list<std::pair<int, std::size_t>> steps) {
        for (const auto& [milliseconds, completions] : steps) {
            air.machine.advance(milliseconds);
            EXPECT_EQ(air.blocks(), Texts(completions, kCompleted));
        }
    };
    air.act("{'do': 'set', 'anqpMs': 50}");
    air.query();
    air.machine.advance(20);
    air.query();
    air.act("{'do': 'set', 'anqpMs': 10}");
    air.query();
    expectCompletions({{9, 0}, {1, 1}, {19, 0}, {1, 1}, {19, 0}, {1, 1}, {1000, 0}});
    air.query();
    air.machine.advance(5);
    air.query();
    air.act("{'do': 'completeAnqpQuery'}");  // in place of the first
    expectCompletions({{0, 1}, {9, 0}, {1, 1}, {1000, 0}});
    air.query();
    air.act("{'do': 'pullAdapter'}");
    air.act("{'do': 'insertAdapter'}");
    expectCompletions({{1000, 0}});
}

TEST(HotspotModule, AUserWhoLeavesIsToldWithTheNetworkAsItIsKnown) {
    Air air(network("01", ""));
    const std::pair<const char*, std::string> cases[] = {
        {"'ssid': 'Cafe'", kCafe},
        {"'ssid': 'Cafe', 'isHs20': 2", record("020000000001", "43616665", "02000000 02000000 01000000")},
        {"'ssid': 'Other'", record(zeros(6), "4f74686572", "01000000 00000000 00000000")},
    };
    for (const auto& [members, record] : cases) {
        air.act(std::string("{'do': 'userDisconnect', ") + members + "}");
        EXPECT_EQ(air.blocks(), Texts{kHeader + "0500000034000000" + record}) << members;
    }
}

TEST(HotspotModule, ASessionChangesJustBeforeItsMessage) {
    Station station("{'session': 'disconnected'}");
    EXPECT_FALSE(platform::isSessionActive());
    bool wasActive = false;
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        wasActive = platform::isSessionActive();
    };
    station.act("{'do': 'sessionChange', 'eventType': 4, 'sessionId': 258, 'session': 'active'}");
    EXPECT_TRUE(wasActive);
    EXPECT_EQ(station.blocks(), Texts{kHeader + hex("06000000 08000000 04000000 02010000")});
    station.act("{'do': 'sessionChange', 'eventType': 3}");
    EXPECT_TRUE(wasActive);
}

}  // namespace
}  // namespace vexa::simulation
