#pragma once

#include <json/value.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/Clock.h"
#include "platform/WlanApi.h"
#include "simulation/scenario/Networks.h"
#include "simulation/scenario/Spectrum.h"

namespace vexa::simulation {

/// The story that a simulated machine starts from: what is in it, what is in range, what happens when.

struct AdapterSetup {
    std::string guidText;
    GUID guid{};
    std::optional<std::string> hardwareId;
    Bytes macAddress;
    bool inserted = true;
    bool listed = true;
    DOT11_RADIO_STATE hardwareRadio = dot11_radio_state_on;
    DOT11_RADIO_STATE softwareRadio = dot11_radio_state_on;
    std::vector<std::string> dns = {"192.0.2.53"};
};

/// One subkey of the network class key; nothing: no such value.
struct ClassKeyEntry {
    std::optional<std::string> netCfgInstanceId;
    std::optional<std::string> matchingDeviceId;
};

struct TimelineEntry {
    platform::Duration at{};
    Json::Value action;
};

enum class SessionState { Active, Disconnected };

/// "active" or "disconnected".
SessionState readSessionState(const JsonPlace& place);

struct Scenario {
    double speed = 1;
    std::uint64_t seed = 1;
    std::string user = "KORVANE-PC\\user";
    SessionState session = SessionState::Active;
    std::optional<std::string> hotspotAutoConnect;
    std::optional<std::string> config;
    std::vector<AdapterSetup> adapters;
    std::vector<ClassKeyEntry> registryClass;
    std::vector<Network> networks;
    platform::Duration connectTime = std::chrono::milliseconds(200);
    platform::Duration anqpTime = std::chrono::milliseconds(200);
    std::optional<Spectrum> spectrum;
    std::vector<TimelineEntry> timeline;  ///< In the order of the times.
};

/// Reads a scenario, a JSON object. Throws JsonFault with one line that names the member at fault.
Scenario parseScenario(std::string_view text);

}  // namespace vexa::simulation
