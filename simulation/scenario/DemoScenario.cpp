#include "simulation/scenario/DemoScenario.h"

namespace vexa::simulation {

// The machine lives three times as fast, so that what the service does every ten seconds is seen within a
// few. Its times are a third of these.
std::string_view demoScenario() {
    return R"json({
    "speed": 3,
    "seed": 7,
    "connectMs": 2000,
    "spectrum": {
        "channels": [1, 6, 11, 36, 40, 44, 48, 149, 153, 157, 161],
        "scanMs": 1200,
        "levels": {
            "1":   {"congestion": 34, "power": 38, "spread": 6},
            "6":   {"congestion": 41, "power": 44, "spread": 7},
            "11":  {"congestion": 27, "power": 33, "spread": 6},
            "36":  {"congestion": 22, "power": 30, "spread": 5},
            "40":  {"congestion": 12, "power": 22, "spread": 4},
            "44":  {"congestion": 9,  "power": 18, "spread": 3},
            "48":  {"congestion": 15, "power": 24, "spread": 4},
            "149": {"congestion": 18, "power": 26, "spread": 5},
            "153": {"congestion": 6,  "power": 15, "spread": 3},
            "157": {"congestion": 11, "power": 20, "spread": 4},
            "161": {"congestion": 5,  "power": 14, "spread": 3}
        }
    },
    "networks": [
        {"bssid": "02:c1:7e:00:00:01", "ssid": "City Free", "channel": 6,
         "realms": [{"names": ["city.example"], "eapMethods": [21]}],
         "accepts": [{"eapMethod": 21, "username": "guest-4711"}]},
        {"bssid": "02:c1:7e:00:00:02", "ssid": "Departures", "channel": 36, "visible": false,
         "realms": [{"names": ["lounge.example"], "eapMethods": [21]}],
         "accepts": [{"eapMethod": 21, "username": "anna"}]},
        {"bssid": "02:c1:7e:00:00:03", "ssid": "Departures", "channel": 44, "visible": false,
         "realms": [{"names": ["corp.example"], "eapMethods": [13]}]},
        {"bssid": "02:c1:7e:00:00:04", "ssid": "Gate 12", "channel": 149, "visible": false,
         "realms": [{"names": ["corp.example"], "eapMethods": [13]}],
         "accepts": [{"eapMethod": 13, "authMode": "machine"}]}
    ],
    "timeline": [
        {"atMs": 15300, "do": "show", "bssid": "02:c1:7e:00:00:04"},
        {"atMs": 15600, "do": "reportNetworks"},
        {"atMs": 18000, "do": "hide", "bssid": "02:c1:7e:00:00:01"},
        {"atMs": 18300, "do": "reportNetworks"},
        {"atMs": 33000, "do": "show", "bssid": "02:c1:7e:00:00:02"},
        {"atMs": 33000, "do": "show", "bssid": "02:c1:7e:00:00:03"},
        {"atMs": 33300, "do": "reportNetworks"},
        {"atMs": 10500, "do": "levels", "levels": {
            "6":  {"congestion": 48, "power": 66, "spread": 9},
            "11": {"congestion": 39, "power": 61, "spread": 9}}},
        {"atMs": 15000, "do": "levels", "levels": {
            "1":  {"congestion": 44, "power": 55, "spread": 8},
            "6":  {"congestion": 63, "power": 84, "spread": 8},
            "11": {"congestion": 57, "power": 79, "spread": 8}}},
        {"atMs": 28500, "do": "levels", "levels": {
            "1":  {"congestion": 36, "power": 40, "spread": 6},
            "6":  {"congestion": 45, "power": 47, "spread": 7},
            "11": {"congestion": 30, "power": 36, "spread": 6}}},
        {"atMs": 31500, "do": "levels", "levels": {
            "36": {"congestion": 58, "power": 46, "spread": 8},
            "40": {"congestion": 37, "power": 35, "spread": 6}}},
        {"atMs": 36000, "do": "levels", "levels": {
            "36": {"congestion": 86, "power": 58, "spread": 7},
            "40": {"congestion": 55, "power": 44, "spread": 7},
            "44": {"congestion": 31, "power": 29, "spread": 5}}},
        {"atMs": 49500, "do": "levels", "levels": {
            "36": {"congestion": 33, "power": 34, "spread": 5},
            "40": {"congestion": 16, "power": 24, "spread": 4},
            "44": {"congestion": 10, "power": 19, "spread": 3}}},
        {"atMs": 54000, "do": "levels", "levels": {
            "6":  {"congestion": 38, "power": 42, "spread": 6},
            "11": {"congestion": 25, "power": 32, "spread": 5},
            "36": {"congestion": 21, "power": 29, "spread": 4}}}
    ]
}
)json";
}

}  // namespace vexa::simulation
