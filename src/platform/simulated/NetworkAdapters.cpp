#include "platform/NetworkAdapters.h"

#include "platform/Guid.h"
#include "simulation/Machine.h"

namespace vexa::platform {

namespace {

constexpr std::uint32_t kErrorNoData = 232;
constexpr std::uint32_t kErrorInvalidParameter = 87;

std::uint32_t interfaceIndexOf(std::size_t adapter) {
    return static_cast<std::uint32_t>(adapter) + 1;
}

}  // namespace

AdapterList getAdaptersAddresses(std::uint32_t bufferSize) {
    simulation::Machine* const machine = simulation::Machine::current();
    if (machine == nullptr) return {kErrorNoData, 0, {}};
    if (const auto error = machine->faults().nextError("GetAdaptersAddresses"))
        return {*error, bufferSize, {}};
    AdapterList list{0, bufferSize, {}};
    for (const std::size_t index : machine->adapters().inserted()) {
        const simulation::AdapterSetup adapter = machine->adapters().snapshot(index);
        if (!adapter.listed) continue;
        list.adapters.push_back({kInterfaceTypeIeee80211, interfaceIndexOf(index), guidToString(adapter.guid),
                                 adapter.macAddress});
    }
    return list;
}

PerAdapterInfo getPerAdapterInfo(std::uint32_t interfaceIndex, std::uint32_t bufferSize) {
    simulation::Machine* const machine = simulation::Machine::current();
    if (machine == nullptr) return {kErrorNoData, 0, {}};
    if (const auto error = machine->faults().nextError("GetPerAdapterInfo")) return {*error, bufferSize, {}};
    for (const std::size_t index : machine->adapters().inserted()) {
        if (interfaceIndexOf(index) != interfaceIndex) continue;
        const auto dns = machine->adapters().snapshot(index).dns;
        return {0, bufferSize, dns.empty() ? std::string() : dns.front()};
    }
    return {kErrorInvalidParameter, 0, {}};
}

}  // namespace vexa::platform
