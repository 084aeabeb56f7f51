#include <gtest/gtest.h>

#include "TestMachine.h"

namespace vexa::simulation {
namespace {

const std::string kHeader = "005ec40300000000";

std::string zeros(std::size_t bytes) {
    return std::string(bytes * 2, '0');
}

/// A record: BSSID, SSID in hex, and the three numbers in hex.
std::string record(const std::string& bssid, const std::string& ssid, const std::string& isHs20 = "01000000",
                   const std::string& type = "02000000", const std::string& internet = "01000000") {
    return bssid + ssid + zeros(34 - ssid.size() / 2) + isHs20 + type + internet;
}

const std::string kCafe = record("020000000001", "43616665");
const std::string kCompleted = kHeader + "0400000000000000";

std::string network(const std::string& number, const std::string& ssid, const std::string& more = "") {
    return "{'bssid': '02:00:00:00:00:" + number + "', 'ssid': '" + ssid + "'" + (more.empty() ? "" : ", ") +
           more + "}";
}

std::string scenarioWith(const std::string& networks) {
    return "{'networks': [" + networks + "]}";
}

/// The client's side of the module.
class Air {
public:
    explicit Air(const std::string& scenario) : machine(scenario) {}

    DWORD send(const std::string& request, DWORD capacity) {
        const GUID guid = machine.guid();
        Bytes bytes = bytesFromHex(request).value_or(Bytes{});
        Bytes output(capacity, 0xEE);
        DWORD returned = 0;
        const DWORD result = WlanIhvControl(listener.handle(), &guid, wlan_ihv_control_type_service,
                                            static_cast<DWORD>(bytes.size()), bytes.data(), capacity,
                                            output.data(), &returned);
        answer = hexText(std::span(output).first(returned));
        return result;
    }

    std::string bssList(DWORD capacity = 10240) {
        EXPECT_EQ(send(kHeader + "05000000" + zeros(8), capacity), ERROR_SUCCESS);
        return answer;
    }

    DWORD askAnqp(const std::string& bssid, DWORD capacity = 10240) {
        return send(kHeader + "0800000034000000" + record(bssid, "00"), capacity);
    }

    std::string anqp(const std::string& bssid) {
        EXPECT_EQ(askAnqp(bssid), ERROR_SUCCESS);
        return answer;
    }

    void query() { EXPECT_EQ(send(kHeader + "03000000" + zeros(8), 0), ERROR_SUCCESS); }

    /// The data blocks since the last call, as hex.
    std::vector<std::string> messages() {
        std::vector<std::string> out;
        const auto heard = listener.heard();
        for (; m_seen < heard.size(); ++m_seen) {
            EXPECT_EQ(heard[m_seen].source, WLAN_NOTIFICATION_SOURCE_IHV);
            EXPECT_EQ(heard[m_seen].code, 0U);
            out.push_back(hexText(heard[m_seen].data));
        }
        return out;
    }

    void perform(const std::string& action) { EXPECT_EQ(machine.ask(action), R"({"ok":true})") << action; }

    TestMachine machine;
    Listener listener;
    std::string answer;

private:
    std::size_t m_seen = 0;
};

using Messages = std::vector<std::string>;

TEST(HotspotModule, TheListHoldsTheVisibleReportedNetworksInOrder) {
    Air air(scenarioWith(network("01", "Cafe") + "," + network("02", "Away", "'visible': false") + "," +
                         network("03", "Quiet", "'reported': false") + "," +
                         "{'bssid': '02:00:00:00:00:04', 'ssidHex': '00ff" + std::string(60, '1') +
                         "', 'hs20': false, 'networkType': 7, 'internetAccess': 0}"));
    const std::string last =
        record("020000000004", "00ff" + std::string(60, '1'), "00000000", "07000000", "00000000");
    EXPECT_EQ(air.bssList(), kCafe + last);
    air.perform("{'do': 'show', 'bssid': '02:00:00:00:00:02'}");
    EXPECT_EQ(air.bssList(), kCafe + record("020000000002", "41776179") + last);
    air.perform("{'do': 'hide', 'bssid': '02:00:00:00:00:01'}");
    EXPECT_EQ(air.bssList(), record("020000000002", "41776179") + last);
    EXPECT_EQ(air.messages(), Messages{});
}

TEST(HotspotModule, TheListIsCutToWholeRecordsThatFit) {
    Air air(scenarioWith(network("01", "Cafe") + "," + network("02", "Cafe")));
    const struct {
        DWORD capacity;
        std::size_t records;
    } cases[] = {{0, 0}, {51, 0}, {52, 1}, {103, 1}, {104, 2}};
    for (const auto& [capacity, records] : cases)
        EXPECT_EQ(air.bssList(capacity).size(), records * 104) << capacity;
}

TEST(HotspotModule, RequestsOfAnotherFormAreRefused) {
    Air air(scenarioWith(network("01", "Cafe")));
    const std::string requests[] = {
        kHeader + "05000000" + zeros(4),                // too short
        kHeader + "05000000" + zeros(9),                // too long
        kHeader + "0500000004000000" + zeros(4),        // a payload that the list doesn't have
        kHeader + "0300000001000000" + zeros(4),        //
        "005ec403010000000500000000000000" + zeros(4),  // reserved
        kHeader + "0800000034000000" + zeros(51),       // a record too short
        kHeader + "0800000000000000" + zeros(52),       // no length
        kHeader + "04000000" + zeros(8),                // no such request
        "015ec403000000000500000000000000" + zeros(4),  // another signature
    };
    for (const std::string& request : requests)
        EXPECT_EQ(air.send(request, 100), ERROR_INVALID_PARAMETER) << request;
}

TEST(HotspotModule, BelongsToTheMakersAdapterAlone) {
    Air air("{'adapters': [{'hardwareId': null}, {}], 'networks': [" + network("01", "Cafe") + "]}");
    EXPECT_EQ(air.send(kHeader + "05000000" + zeros(8), 100), ERROR_INVALID_PARAMETER);
}

TEST(HotspotModule, TheRealmListIsBuiltAsTheNetworkGivesIt) {
    const struct {
        const char* members;
        const char* info;
    } cases[] = {
        {"", "00000000"},
        {"'realms': []", "020000000000"},
        {"'realms': [{}]",
         "07000000"
         "0100"
         "0300"
         "000000"},
        {"'realms': [{'names': ['a.b', 'c'], 'eapMethods': [13, 21]}]",
         "12000000"
         "0100"
         "0e00"
         "00"
         "05"
         "612e623b63"
         "02"
         "020d00"
         "021500"},
        {"'realms': [{'names': ['a']}, {'eapMethods': [255]}]",
         "10000000"
         "0200"
         "0400"
         "00"
         "01"
         "61"
         "00"
         "0600"
         "00"
         "00"
         "01"
         "02ff00"},
        {"'naiRealmHex': ''", "00000000"},
        {"'naiRealmHex': 'FfEe01'",
         "03000000"
         "ffee01"},
    };
    for (const auto& [members, info] : cases) {
        Air air(scenarioWith(network("01", "Cafe", members)));
        EXPECT_EQ(air.anqp("020000000001"), info) << members;
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
    EXPECT_EQ(air.messages(), Messages{});
    air.machine.advance(1);
    EXPECT_EQ(answers(), "++---");
    EXPECT_EQ(air.messages(), Messages{kCompleted});
    air.perform("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:02', 'anqp': 'onQuery'}");
    EXPECT_EQ(answers(), "+----");
    air.perform("{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:02'}");
    air.perform("{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:03'}");
    EXPECT_EQ(answers(), "++---");
}

TEST(HotspotModule, EachQueryHasItsOwnCompletion) {
    Air air("{'anqpMs': 50}");
    air.query();
    air.machine.advance(20);
    air.query();
    air.perform("{'do': 'set', 'anqpMs': 10}");
    air.query();
    const struct {
        int milliseconds;
        std::size_t completions;
    } steps[] = {{9, 0}, {1, 1}, {19, 0}, {1, 1}, {19, 0}, {1, 1}, {1000, 0}};
    for (const auto& [milliseconds, completions] : steps) {
        air.machine.advance(milliseconds);
        EXPECT_EQ(air.messages(), Messages(completions, kCompleted));
    }
}

TEST(HotspotModule, CompletingByHandTakesThePlaceOfTheNextOneDue) {
    Air air(scenarioWith(network("01", "Later", "'anqp': 'onQuery'")));
    air.query();
    air.machine.advance(100);
    air.query();
    air.perform("{'do': 'completeAnqpQuery'}");
    EXPECT_EQ(air.messages(), Messages{kCompleted});
    EXPECT_EQ(air.anqp("020000000001"), "00000000");
    air.machine.advance(199);
    EXPECT_EQ(air.messages(), Messages{});
    air.machine.advance(1);
    EXPECT_EQ(air.messages(), Messages{kCompleted});
    air.perform("{'do': 'completeAnqpQuery'}");
    EXPECT_EQ(air.messages(), Messages{kCompleted});
}

TEST(HotspotModule, AnAnswerIsThereWhenItsNotificationComes) {
    Air air(scenarioWith(network("01", "Later", "'anqp': 'onQuery'")));
    std::string during;
    air.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { during = air.anqp("020000000001"); };
    air.perform("{'do': 'completeAnqpQuery'}");
    EXPECT_EQ(during, "00000000");
}

TEST(HotspotModule, APulledAdapterForgetsItsQueries) {
    Air air("{}");
    air.query();
    air.perform("{'do': 'pullAdapter'}");
    air.perform("{'do': 'insertAdapter'}");
    air.machine.advance(1000);
    EXPECT_EQ(air.listener.codes(), "8/14 8/13");
}

TEST(HotspotModule, ReportsHaveExactlyTheirBytes) {
    Air air(scenarioWith(network("01", "Cafe") + "," + network("02", "Away", "'visible': false")));
    const struct {
        const char* action;
        std::string message;
    } cases[] = {
        {"{'do': 'reportNetworks'}", kHeader + "0200000034000000" + kCafe},
        {"{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:01'}", kHeader + "0300000034000000" + kCafe},
        {"{'do': 'completeAnqpQuery'}", kCompleted},
        {"{'do': 'userDisconnect', 'ssid': 'Cafe'}", kHeader + "0500000034000000" + kCafe},
        {"{'do': 'userDisconnect', 'ssid': 'Cafe', 'isHs20': 2}",
         kHeader + "0500000034000000" + record("020000000001", "43616665", "02000000")},
        {"{'do': 'userDisconnect', 'ssid': 'Other'}",
         kHeader + "0500000034000000" + record(zeros(6), "4f74686572", "01000000", "00000000", "00000000")},
        {"{'do': 'sessionChange', 'eventType': 7, 'sessionId': 258}", kHeader + "0600000008000000"
                                                                                "07000000"
                                                                                "02010000"},
        {"{'do': 'driverState', 'current': 4294967295, 'previous': 3}", kHeader + "0100000008000000"
                                                                                  "ffffffff"
                                                                                  "03000000"},
    };
    for (const auto& [action, message] : cases) {
        air.perform(action);
        EXPECT_EQ(air.messages(), Messages{message}) << action;
    }
    air.perform("{'do': 'hide', 'bssid': '02:00:00:00:00:01'}");
    air.perform("{'do': 'reportNetworks'}");
    EXPECT_EQ(air.messages(), Messages{kHeader + "0200000000000000"});
}

TEST(HotspotModule, ASessionChangesJustBeforeItsMessage) {
    Air air("{}");
    SessionState during = SessionState::Active;
    air.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { during = air.machine->session(); };
    air.perform("{'do': 'sessionChange', 'eventType': 4, 'session': 'disconnected'}");
    EXPECT_EQ(during, SessionState::Disconnected);
    air.perform("{'do': 'sessionChange', 'eventType': 3}");
    EXPECT_EQ(air.machine->session(), SessionState::Disconnected);
}

TEST(HotspotModule, NetworksComeAndChange) {
    Air air("{}");
    EXPECT_EQ(air.bssList(), "");
    air.perform("{'do': 'addNetwork', 'network': " + network("01", "Cafe", "'realms': []") + "}");
    EXPECT_EQ(air.bssList(), kCafe);
    EXPECT_EQ(air.anqp("020000000001"), "020000000000");
    air.perform("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'naiRealmHex': 'aa', 'networkType': 3}");
    EXPECT_EQ(air.anqp("020000000001"), "01000000aa");
    EXPECT_EQ(air.bssList(), record("020000000001", "43616665", "01000000", "03000000"));
    air.perform("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'realms': []}");
    EXPECT_EQ(air.anqp("020000000001"), "020000000000");
}

TEST(HotspotModule, WhatNamesNoNetworkIsRefused) {
    Air air(scenarioWith(network("01", "Cafe")));
    const struct {
        std::string action;
        const char* error;
    } cases[] = {
        {"{'do': 'show', 'bssid': '02:00:00:00:00:09'}", "bssid: no such network"},
        {"{'do': 'hide', 'bssid': '02:00:00:00:00:09'}", "bssid: no such network"},
        {"{'do': 'setNetwork', 'bssid': '02:00:00:00:00:09', 'hs20': true}", "bssid: no such network"},
        {"{'do': 'reportAnqp', 'bssid': '02:00:00:00:00:09'}", "bssid: no such network"},
        {"{'do': 'addNetwork', 'network': " + network("01", "New") + "}", "network.bssid: is there already"},
        {"{'do': 'userDisconnect', 'ssid': '" + std::string(33, 'x') + "'}", "ssid: more than 32 bytes"},
    };
    for (const auto& [action, error] : cases) {
        EXPECT_EQ(air.machine.ask(action), std::string(R"({"error":")") + error + R"(","ok":false})")
            << action;
    }
    EXPECT_EQ(air.bssList(), kCafe);
}

}  // namespace
}  // namespace vexa::simulation
