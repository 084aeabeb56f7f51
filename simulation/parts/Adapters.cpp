#include "simulation/parts/Adapters.h"

#include "platform/Guid.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

namespace {

constexpr std::string_view kMakerPrefixes[] = {"pci\\ven_1f5d", "usb\\vid_2b7e"};

bool isMakers(const AdapterSetup& adapter) {
    for (const std::string_view prefix : kMakerPrefixes) {
        if (adapter.hardwareId && startsWithNoCase(*adapter.hardwareId, prefix)) return true;
    }
    return false;
}

}  // namespace

Adapters::Adapters(std::vector<AdapterSetup> adapters)
    : m_count(adapters.size()), m_adapters(std::move(adapters)) {}

std::vector<std::size_t> Adapters::inserted() const {
    const LockGuard<Mutex> lock(m_mutex);
    std::vector<std::size_t> indices;
    for (std::size_t i = 0; i < m_adapters.size(); ++i) {
        if (m_adapters[i].inserted) indices.push_back(i);
    }
    return indices;
}

std::optional<std::size_t> Adapters::findInserted(const GUID& guid) const {
    const LockGuard<Mutex> lock(m_mutex);
    for (std::size_t i = 0; i < m_adapters.size(); ++i) {
        if (m_adapters[i].inserted && areGuidsEqual(m_adapters[i].guid, guid)) return i;
    }
    return std::nullopt;
}

std::optional<std::size_t> Adapters::served() const {
    return firstOfMaker(true);
}

std::optional<std::size_t> Adapters::usual() const {
    if (const auto index = served()) return index;
    if (const auto index = firstOfMaker(false)) return index;
    return m_count > 0 ? std::optional<std::size_t>(0) : std::nullopt;
}

std::optional<std::size_t> Adapters::firstOfMaker(bool mustBeInserted) const {
    const LockGuard<Mutex> lock(m_mutex);
    for (std::size_t i = 0; i < m_adapters.size(); ++i) {
        if (isMakers(m_adapters[i]) && (m_adapters[i].inserted || !mustBeInserted)) return i;
    }
    return std::nullopt;
}

GUID Adapters::guid(std::size_t index) const {
    return snapshot(index).guid;
}

bool Adapters::isOfMaker(std::size_t index) const {
    return isMakers(snapshot(index));
}

RadioState Adapters::radio(std::size_t index) const {
    const LockGuard<Mutex> lock(m_mutex);
    return {m_adapters.at(index).hardwareRadio, m_adapters.at(index).softwareRadio};
}

void Adapters::setRadio(std::size_t index, std::optional<DOT11_RADIO_STATE> hardware,
                        std::optional<DOT11_RADIO_STATE> software) {
    const LockGuard<Mutex> lock(m_mutex);
    AdapterSetup& adapter = m_adapters.at(index);
    adapter.hardwareRadio = hardware.value_or(adapter.hardwareRadio);
    adapter.softwareRadio = software.value_or(adapter.softwareRadio);
}

void Adapters::setInserted(std::size_t index, bool inserted) {
    const LockGuard<Mutex> lock(m_mutex);
    m_adapters.at(index).inserted = inserted;
}

void Adapters::setDns(std::size_t index, std::vector<std::string> addresses) {
    const LockGuard<Mutex> lock(m_mutex);
    m_adapters.at(index).dns = std::move(addresses);
}

AdapterSetup Adapters::snapshot(std::size_t index) const {
    const LockGuard<Mutex> lock(m_mutex);
    return m_adapters.at(index);
}

}  // namespace vexa::simulation
