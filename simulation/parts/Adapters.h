#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "platform/Mutex.h"
#include "platform/WlanApi.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::simulation {

struct RadioState {
    DOT11_RADIO_STATE hardware;
    DOT11_RADIO_STATE software;
};

/// The machine's network adapters as they are now. Adapters are named by their index in the scenario. Any
/// thread.
class Adapters {
public:
    explicit Adapters(std::vector<AdapterSetup> adapters);

    std::size_t count() const { return m_count; }

    /// The inserted adapters, in their order.
    std::vector<std::size_t> inserted() const;
    std::optional<std::size_t> findInserted(const GUID& guid) const;

    /// The one that the maker's modules belong to: the first of the maker's that is inserted.
    std::optional<std::size_t> served() const;

    /// The served one; if there is none the first of the maker's, or the first of all.
    std::optional<std::size_t> usual() const;

    GUID guid(std::size_t index) const;
    bool isOfMaker(std::size_t index) const;
    RadioState radio(std::size_t index) const;
    void setRadio(std::size_t index, std::optional<DOT11_RADIO_STATE> hardware,
                  std::optional<DOT11_RADIO_STATE> software);
    void setInserted(std::size_t index, bool inserted);
    void setDns(std::size_t index, std::vector<std::string> addresses);

    /// What the operating system's list of adapters tells of one.
    AdapterSetup snapshot(std::size_t index) const;

private:
    std::optional<std::size_t> firstOfMaker(bool mustBeInserted) const;

    const std::size_t m_count;
    mutable platform::Mutex m_mutex;
    std::vector<AdapterSetup> m_adapters GUARDED_BY(m_mutex);
};

}  // namespace vexa::simulation
