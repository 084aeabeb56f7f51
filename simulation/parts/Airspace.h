#pragma once

#include <memory>
#include <span>
#include <vector>

#include "platform/Mutex.h"
#include "simulation/scenario/Networks.h"

namespace vexa::simulation {

/// The networks of the place where the machine stands, as they are now. A network is named by its BSSID; of
/// several with one SSID the first visible one is meant. What is given out stays as it is; a change makes
/// another in its place. Any thread.
class Airspace {
public:
    using Found = std::shared_ptr<const Network>;  // null: there is none

    explicit Airspace(std::vector<Network> networks);

    /// In the order of the scenario, later ones behind.
    std::vector<Found> visible() const;
    Found find(std::span<const std::uint8_t> bssid) const;
    Found findVisible(std::span<const std::uint8_t> ssid) const;

    // Each gives false if there is no such network, or, for add(), if there is one already.
    bool add(Network network);
    bool change(const JsonPlace& changes);
    bool setVisible(std::span<const std::uint8_t> bssid, bool visible);

    /// What an ANQP query leaves behind: networks that answer only then do so from now on.
    void answerQueries();
    void answerQuery(std::span<const std::uint8_t> bssid);

private:
    Found* findLocked(std::span<const std::uint8_t> bssid) REQUIRES(m_mutex);

    mutable platform::Mutex m_mutex{"the networks in the air"};
    std::vector<Found> m_networks GUARDED_BY(m_mutex);
};

}  // namespace vexa::simulation
