#include <gtest/gtest.h>

#include "Station.h"

namespace vexa::simulation {
namespace {

const std::string kHeader = hex("005ec403 00000000");

/// A record: BSSID, SSID in hex, and the three numbers in hex.
std::string record(const std::string& bssid, const std::string& ssid, const std::string& isHs20 = "01000000",
                   const std::string& type = "02000000", const std::string& internet = "01000000") {
    return bssid + ssid + zeros(34 - ssid.size() / 2) + isHs20 + type + internet;
}

const std::string kCafe = record("020000000001", "43616665");
const std::string kCompleted = kHeader + hex("04000000 00000000");

std::string network(const std::string& number, const std::string& ssid, const std::string& more = "") {
    return "{'bssid': '02:00:00:00:00:" + number + "', 'ssid': '" + ssid + "'" + (more.empty() ? "" : ", ") +
           more + "}";
}

std::string scenarioWith(const std::string& networks) {
    return "{'networks': [" + networks + "]}";
}

/// The client's side of the module.
class Air : public Station {
public:
    using Station::Station;

    DWORD send(const std::string& request, DWORD capacity) {
        return control(wlan_ihv_control_type_service, bytesFromHex(request).value_or(Bytes{}), capacity);
    }

    std::string bssList(DWORD capacity = 10240) {
        EXPECT_EQ(send(kHeader + "05000000" + zeros(8), capacity), ERROR_SUCCESS);
        return hexText(output);
    }

    DWORD askAnqp(const std::string& bssid, DWORD capacity = 10240) {
        return send(kHeader + "0800000034000000" + record(bssid, "00"), capacity);
    }

    std::string anqp(const std::string& bssid) {
        EXPECT_EQ(askAnqp(bssid), ERROR_SUCCESS);
        return hexText(output);
    }

    void query() { EXPECT_EQ(send(kHeader + "03000000" + zeros(8), 0), ERROR_SUCCESS); }
};

TEST(HotspotModule, TheListHoldsTheVisibleReportedNetworksInOrder) {
    const std::string ssid = "00ff" + std::string(60, '1');
    Air air(scenarioWith(network("01", "Cafe") + "," + network("02", "Away", "'visible': false") + "," +
                         network("03", "Quiet", "'reported': false") + ",{'bssid': '0a:Bc:00:00:00:04'," +
                         "'ssidHex': '" + ssid + "', 'hs20': false, 'networkType': 7, 'internetAccess': 0}"));
    const std::string away = record("020000000002", "41776179");
    const std::string last = record("0abc00000004", ssid, "00000000", "07000000", "00000000");
    EXPECT_EQ(air.bssList(), kCafe + last);
    air.act("{'do': 'show', 'bssid': '02:00:00:00:00:02'}");
    EXPECT_EQ(air.bssList(), kCafe + away + last);
    for (const DWORD capacity : {0U, 51U, 52U, 103U, 104U})
        EXPECT_EQ(air.bssList(capacity), (kCafe + away).substr(0, capacity / 52 * 104)) << capacity;
    air.act("{'do': 'hide', 'bssid': '02:00:00:00:00:01'}");
    EXPECT_EQ(air.bssList(), away + last);
    EXPECT_EQ(air.told(), Texts{});
}

TEST(HotspotModule, RequestsOfAnotherFormOrToAnotherAdapterAreRefused) {
    Air air("{'adapters': [{}, {}]}");
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
    air.guid = air.machine->adapters().guid(1);
    EXPECT_EQ(air.send(kHeader + "05000000" + zeros(8), 100), ERROR_INVALID_PARAMETER);
}

TEST(HotspotModule, TheRealmListIsBuiltAsTheNetworkGivesIt) {
    const struct {
        std::string members;
        std::string info;
    } cases[] = {
        {"", "00000000"},
        {"'realms': []", "02000000 0000"},
        {"'realms': [{}]", "07000000 0100 0300 000000"},
        {"'realms': [{'names': ['a.b', 'c'], 'eapMethods': [13, 21]}]",
         "12000000 0100 0e00 00 05 612e623b63 02 020d00 021500"},
        {"'realms': [{'names': ['a']}, {'eapMethods': [255]}]",
         "10000000 0200 0400 00 01 61 00 0600 00 00 01 02ff00"},
        {"'naiRealmHex': ''", "00000000"},
        {"'naiRealmHex': 'FfEe01'", "03000000 ffee01"},
    };
    for (const auto& [members, info] : cases) {
        Air air(scenarioWith(network("01", "Cafe", members)));
        EXPECT_EQ(air.anqp("020000000001"), hex(info)) << members;
    }
}

TEST(HotspotModule, AnAnswerThatDoesNotFitIsAnError) {
    Air air(scenarioWith(network("01", "Cafe", "'naiRealmHex': '" + zeros(10236) + "'") + "," +
                         network("02", "Cafe", "'naiRealmHex': '" + zeros(10237) + "'")));
    EXPECT_EQ(air.anqp("020000000001").size(), 2U * 10240);
    EXPECT_EQ(air.askAnqp("020000000002"), ERROR_INSUFFICIENT_BUFFER);
    EXPECT_EQ(air.askAnqp("020000000001", 3), ERROR_INSUFFICIENT_BUFFER);
}

TEST(HotspotModule, ANetworkWithoutAnAnswerYetGivesNothing) {
    Air air(scenarioWith(network("01", "Ready") + "," + network("02", "Later", "'anqp': 'onQuery'") + "," +
                         network("03", "Never", "'anqp': 'never'") + "," +
                         network("04", "Quiet", "'reported': false")));
    const auto answers = [&] {
        std::string out;
        for (const char* bssid :
             {"020000000001", "020000000002", "020000000003", "020000000004", "0a0000000000"})
            out += air.anqp(bssid).empty() ? "-" : "+";
        return out;
    };
    EXPECT_EQ(answers(), "+----");
    air.query();
    air.machine.advance(199);
    EXPECT_EQ(answers(), "+----");
    EXPECT_EQ(air.blocks(), Texts{});
    air.machine.advance(1);
    EXPECT_EQ(answers(), "++---");
    EXPECT_EQ(air.blocks(), Texts{kCompleted});
    air.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:02', 'anqp': 'onQuery'}");
    EXPECT_EQ(answers(), "+----");
    air.act("{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:02'}");
    air.act("{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:03'}");
    EXPECT_EQ(answers(), "++---");
}

TEST(HotspotModule, EachQueryHasItsOwnCompletion) {
    Air air("{'anqpMs': 50}");
    air.query();
    air.machine.advance(20);
    air.query();
    air.act("{'do': 'set', 'anqpMs': 10}");
    air.query();
    const struct {
        int milliseconds;
        std::size_t completions;
    } steps[] = {{9, 0}, {1, 1}, {19, 0}, {1, 1}, {19, 0}, {1, 1}, {1000, 0}};
    for (const auto& [milliseconds, completions] : steps) {
        air.machine.advance(milliseconds);
        EXPECT_EQ(air.blocks(), Texts(completions, kCompleted));
    }
    air.query();
    air.act("{'do': 'pullAdapter'}");
    air.act("{'do': 'insertAdapter'}");
    air.machine.advance(1000);
    EXPECT_EQ(air.blocks(), Texts{});
}

TEST(HotspotModule, CompletingByHandTakesThePlaceOfTheNextOneDue) {
    Air air(scenarioWith(network("01", "Later", "'anqp': 'onQuery'")));
    std::string during;
    air.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { during = air.anqp("020000000001"); };
    air.query();
    air.machine.advance(100);
    air.query();
    air.act("{'do': 'completeAnqpQuery'}");
    EXPECT_EQ(air.blocks(), Texts{kCompleted});
    EXPECT_EQ(during, "00000000");
    air.machine.advance(199);
    EXPECT_EQ(air.blocks(), Texts{});
    air.machine.advance(1);
    EXPECT_EQ(air.blocks(), Texts{kCompleted});
}

TEST(HotspotModule, ReportsHaveExactlyTheirBytes) {
    Air air(scenarioWith(network("01", "Cafe") + "," + network("02", "Away", "'visible': false")));
    const struct {
        const char* action;
        std::string message;
    } cases[] = {
        {"{'do': 'reportNetworks'}", "0200000034000000" + kCafe},
        {"{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:01'}", "0300000034000000" + kCafe},
        {"{'do': 'completeAnqpQuery'}", hex("04000000 00000000")},
        {"{'do': 'userDisconnect', 'ssid': 'Cafe'}", "0500000034000000" + kCafe},
        {"{'do': 'userDisconnect', 'ssid': 'Cafe', 'isHs20': 2}",
         "0500000034000000" + record("020000000001", "43616665", "02000000")},
        {"{'do': 'userDisconnect', 'ssid': 'Other'}",
         "0500000034000000" + record(zeros(6), "4f74686572", "01000000", "00000000", "00000000")},
        {"{'do': 'sessionChange', 'eventType': 7, 'sessionId': 258}",
         hex("06000000 08000000 07000000 02010000")},
        {"{'do': 'driverState', 'current': 4294967295, 'previous': 3}",
         hex("01000000 08000000 ffffffff 03000000")},
    };
    for (const auto& [action, message] : cases) {
        air.act(action);
        EXPECT_EQ(air.blocks(), Texts{kHeader + message}) << action;
    }
}

TEST(HotspotModule, ASessionChangesJustBeforeItsMessage) {
    Air air("{}");
    SessionState during = SessionState::Active;
    air.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { during = air.machine->session(); };
    air.act("{'do': 'sessionChange', 'eventType': 4, 'session': 'disconnected'}");
    EXPECT_EQ(during, SessionState::Disconnected);
    air.act("{'do': 'sessionChange', 'eventType': 3}");
    EXPECT_EQ(air.machine->session(), SessionState::Disconnected);
}

TEST(HotspotModule, NetworksComeAndChange) {
    Air air("{}");
    air.act("{'do': 'addNetwork', 'network': " + network("01", "Cafe", "'realms': []") + "}");
    EXPECT_EQ(air.bssList(), kCafe);
    EXPECT_EQ(air.anqp("020000000001"), "020000000000");
    air.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'naiRealmHex': 'aa', 'networkType': 3}");
    EXPECT_EQ(air.anqp("020000000001"), "01000000aa");
    EXPECT_EQ(air.bssList(), record("020000000001", "43616665", "01000000", "03000000"));
    air.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'realms': []}");
    EXPECT_EQ(air.anqp("020000000001"), "020000000000");
}

}  // namespace
}  // namespace vexa::simulation
