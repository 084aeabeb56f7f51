#pragma once

#include <optional>
#include <span>
#include <vector>

#include "platform/Mutex.h"
#include "simulation/scenario/Networks.h"

namespace vexa::simulation {

/// The networks of the place where the machine stands, as they are now. A network is named by its BSSID; of
/// several with one SSID the first visible one is meant. Any thread.
class Airspace {
public:
    explicit Airspace(std::vector<Network> networks);

    /// In the order of the scenario, later ones behind.
    std::vector<Network> visible() const;
    std::optional<Network> find(std::span<const std::uint8_t> bssid) const;
    std::optional<Network> findVisible(std::span<const std::uint8_t> ssid) const;

    // Each gives false if there is no such network, or, for add(), if there is one already.
    bool add(Network network);
    bool change(const JsonPlace& changes);
    bool setVisible(std::span<const std::uint8_t> bssid, bool visible);

    /// What an ANQP query leaves behind: networks that answer only then do so from now on.
    void answerQueries();
    void answerQuery(std::span<const std::uint8_t> bssid);

private:
    Network* findLocked(std::span<const std::uint8_t> bssid) REQUIRES(m_mutex);

    mutable platform::Mutex m_mutex{"the networks in the air"};
    std::vector<Network> m_networks GUARDED_BY(m_mutex);
};

}  // namespace vexa::simulation
