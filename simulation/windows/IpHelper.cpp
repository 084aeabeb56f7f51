// The machine's adapters as the IP helper lists them, and what of the real one the service needs besides.

#include <winsock2.h>
// After <winsock2.h>.
#include <iphlpapi.h>

#include <algorithm>
#include <array>
#include <optional>
#include <string>
#include <vector>

#include "simulation/windows/LoadedMachine.h"

namespace {

using vexa::simulation::AdapterSetup;
using vexa::simulation::loadedMachine;
using vexa::simulation::Machine;

constexpr ULONG kLoopbackIndex = 1;
constexpr const char* kLoopbackName = "{2F1A5B60-0C3D-4E8F-9A71-10B5D0000000}";

/// A list entry with its text behind it.
struct Entry {
    IP_ADAPTER_ADDRESSES addresses;
    std::array<char, 40> name;
};

ULONG indexOf(std::size_t adapter) {
    return kLoopbackIndex + 1 + static_cast<ULONG>(adapter);
}

Entry entryOf(ULONG index, ULONG type, const std::string& name, const vexa::simulation::Bytes& address) {
    Entry entry{};
    entry.addresses.Length = sizeof entry.addresses;
    entry.addresses.IfIndex = index;
    entry.addresses.IfType = type;
    entry.addresses.OperStatus = IfOperStatusUp;
    entry.addresses.PhysicalAddressLength = static_cast<ULONG>(address.size());
    std::copy(address.begin(), address.end(), entry.addresses.PhysicalAddress);
    name.copy(entry.name.data(), entry.name.size() - 1);
    return entry;
}

std::vector<Entry> entriesOf(Machine& machine) {
    std::vector<Entry> entries{entryOf(kLoopbackIndex, IF_TYPE_SOFTWARE_LOOPBACK, kLoopbackName, {})};
    for (const std::size_t index : machine.adapters().inserted()) {
        const AdapterSetup adapter = machine.adapters().snapshot(index);
        if (!adapter.listed) continue;
        entries.push_back(entryOf(indexOf(index), IF_TYPE_IEEE80211, adapter.guidText, adapter.macAddress));
    }
    return entries;
}

/// The first DNS server of the adapter with this index; nothing if there is no such adapter.
std::optional<std::string> dnsOf(Machine& machine, ULONG index) {
    if (index == kLoopbackIndex) return std::string();
    for (const std::size_t adapter : machine.adapters().inserted()) {
        if (indexOf(adapter) != index) continue;
        const auto servers = machine.adapters().snapshot(adapter).dns;
        return servers.empty() ? std::string() : servers.front();
    }
    return std::nullopt;
}

/// A function of the system's own IP helper, which has the same name as the library that asks for it.
template <class Function>
Function* real(const char* name) {
    static const HMODULE library = [] {
        std::array<wchar_t, MAX_PATH> folder{};
        GetSystemDirectoryW(folder.data(), static_cast<UINT>(folder.size()));
        return LoadLibraryW((std::wstring(folder.data()) + L"\\iphlpapi.dll").c_str());
    }();
    return reinterpret_cast<Function*>(reinterpret_cast<void*>(GetProcAddress(library, name)));
}

}  // namespace

extern "C" {

ULONG WINAPI adaptersOfMachine(ULONG /*family*/, ULONG /*flags*/, PVOID /*reserved*/,
                               PIP_ADAPTER_ADDRESSES buffer, PULONG size) {
    Machine& machine = loadedMachine();
    if (const auto error = machine.faults().nextError("GetAdaptersAddresses")) return *error;
    const std::vector<Entry> entries = entriesOf(machine);
    const auto needed = static_cast<ULONG>(entries.size() * sizeof(Entry));
    if (!buffer || *size < needed) {
        *size = needed;
        return ERROR_BUFFER_OVERFLOW;
    }
    auto* const list = reinterpret_cast<Entry*>(buffer);
    for (std::size_t i = 0; i < entries.size(); ++i) {
        list[i] = entries[i];
        list[i].addresses.AdapterName = list[i].name.data();
        list[i].addresses.Next = i + 1 < entries.size() ? &list[i + 1].addresses : nullptr;
    }
    return ERROR_SUCCESS;
}

DWORD WINAPI adapterOfMachine(ULONG index, PIP_PER_ADAPTER_INFO buffer, PULONG size) {
    Machine& machine = loadedMachine();
    if (const auto error = machine.faults().nextError("GetPerAdapterInfo")) return *error;
    const auto dns = dnsOf(machine, index);
    if (!dns) return ERROR_INVALID_PARAMETER;
    if (!buffer || *size < sizeof *buffer) {
        *size = sizeof *buffer;
        return ERROR_BUFFER_OVERFLOW;
    }
    *buffer = IP_PER_ADAPTER_INFO{};
    dns->copy(buffer->DnsServerList.IpAddress.String, sizeof buffer->DnsServerList.IpAddress.String - 1);
    return ERROR_SUCCESS;
}

ULONG WINAPI tcpTableOfMachine(PMIB_TCPTABLE table, PULONG size, BOOL ordered) {
    if (const auto error = loadedMachine().faults().nextError("GetTcpTable")) return *error;
    return real<decltype(GetTcpTable)>("GetTcpTable")(table, size, ordered);
}

DWORD WINAPI ownersOfMachine(PVOID table, PDWORD size, BOOL ordered, ULONG family, TCP_TABLE_CLASS kind,
                             ULONG reserved) {
    return real<decltype(GetExtendedTcpTable)>("GetExtendedTcpTable")(table, size, ordered, family, kind,
                                                                      reserved);
}
}
