// The functions of the WLAN service, on the machine that lives.

#include <algorithm>
#include <span>
#include <string>

#include "platform/WlanApi.h"
#include "simulation/Machine.h"
#include "simulation/wlan/CallersMemory.h"
#include "simulation/wlan/InterfaceQueries.h"
#include "simulation/wlan/ServiceEntry.h"

namespace {

using vexa::simulation::admit;
using vexa::simulation::Bytes;
using vexa::simulation::IhvRequest;
using vexa::simulation::kServiceNotActive;
using vexa::simulation::Machine;
using vexa::simulation::MachineCode;

constexpr DWORD kNegotiatedVersion = 2;

struct IhvCall {
    HANDLE client;
    const GUID* guid;
    WLAN_IHV_CONTROL_TYPE type;
    std::span<const std::uint8_t> request;
    std::span<std::uint8_t> output;
};

DWORD queryInterface(Machine* machine, HANDLE client, const GUID* guid, WLAN_INTF_OPCODE opcode, PDWORD size,
                     PVOID* data) {
    const DWORD admitted = admit(machine, client, "WlanQueryInterface", std::to_string(opcode));
    if (admitted != ERROR_SUCCESS) return admitted;
    if (!guid || !size || !data) return ERROR_INVALID_PARAMETER;
    const auto adapter = machine->adapters().findInserted(*guid);
    if (!adapter) return ERROR_NOT_FOUND;
    Bytes answer;
    const DWORD result = queryInterfaceValue(*machine, *adapter, opcode, answer);
    if (result != ERROR_SUCCESS) return result;
    *size = static_cast<DWORD>(answer.size());
    *data = vexa::simulation::memoryForCaller(answer.data(), answer.size());
    return ERROR_SUCCESS;
}

DWORD askModule(Machine& machine, const IhvCall& call, IhvRequest kind, Bytes& answer) {
    const auto adapter = machine.adapters().findInserted(*call.guid);
    if (!adapter) return ERROR_NOT_FOUND;
    if (auto reply = machine.faults().nextReply(nameOf(kind))) {
        answer = *std::move(reply);
        return ERROR_SUCCESS;
    }
    const bool isModules = machine.adapters().served() == adapter;
    if (!isModules || kind == IhvRequest::Unknown) return ERROR_INVALID_PARAMETER;
    const bool isSpectral = kind == IhvRequest::Scan || kind == IhvRequest::ChannelList;
    return isSpectral ? machine.spectral().handle(*call.guid, kind, call.request, answer)
                      : machine.hotspot().handle(*call.guid, kind, call.request, call.output.size(), answer);
}

DWORD ihvControl(Machine& machine, const IhvCall& call, PDWORD bytesReturned) {
    const IhvRequest kind = vexa::simulation::classifyIhvRequest(call.type, call.request);
    const DWORD admitted = admit(&machine, call.client, "WlanIhvControl", nameOf(kind));
    if (admitted != ERROR_SUCCESS) return admitted;
    if (!call.guid || !bytesReturned) return ERROR_INVALID_PARAMETER;
    Bytes answer;
    const DWORD result = askModule(machine, call, kind, answer);
    if (result != ERROR_SUCCESS) return result;
    if (answer.size() > call.output.size()) return ERROR_INSUFFICIENT_BUFFER;
    std::copy(answer.begin(), answer.end(), call.output.begin());
    *bytesReturned = static_cast<DWORD>(answer.size());
    return ERROR_SUCCESS;
}

template <class T>
std::span<T> block(PVOID data, DWORD size) {
    return data ? std::span(static_cast<T*>(data), size) : std::span<T>();
}

}  // namespace

DWORD WlanOpenHandle(DWORD /*clientVersion*/, PVOID reserved, PDWORD negotiatedVersion, PHANDLE handle) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    if (!machine) return kServiceNotActive;
    if (const auto error = machine->faults().nextError("WlanOpenHandle")) return *error;
    if (reserved || !negotiatedVersion || !handle) return ERROR_INVALID_PARAMETER;
    *negotiatedVersion = kNegotiatedVersion;
    *handle = machine->handles().open();
    return ERROR_SUCCESS;
}

DWORD WlanCloseHandle(HANDLE handle, PVOID /*reserved*/) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    const DWORD admitted = admit(machine, handle, "WlanCloseHandle");
    if (admitted != ERROR_SUCCESS) return admitted;
    if (!machine->handles().close(handle)) return ERROR_INVALID_HANDLE;
    machine->notifications().unregister(handle);
    return ERROR_SUCCESS;
}

DWORD WlanEnumInterfaces(HANDLE handle, PVOID reserved, PWLAN_INTERFACE_INFO_LIST* list) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    const DWORD admitted = admit(machine, handle, "WlanEnumInterfaces");
    if (admitted != ERROR_SUCCESS) return admitted;
    if (reserved || !list) return ERROR_INVALID_PARAMETER;
    const Bytes content = vexa::simulation::interfaceList(*machine);
    *list = static_cast<PWLAN_INTERFACE_INFO_LIST>(
        vexa::simulation::memoryForCaller(content.data(), content.size()));
    return ERROR_SUCCESS;
}

void WlanFreeMemory(PVOID memory) {
    vexa::simulation::freeCallersMemory(memory);
}

DWORD WlanQueryInterface(HANDLE handle, const GUID* guid, WLAN_INTF_OPCODE opcode, PVOID /*reserved*/,
                         PDWORD size, PVOID* data, WLAN_OPCODE_VALUE_TYPE* valueType) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    const DWORD result = queryInterface(machine, handle, guid, opcode, size, data);
    if (!machine) return result;
    Json::Value details;
    details["opcode"] = static_cast<int>(opcode);
    machine->calls().add({"WlanQueryInterface", machine->elapsed(), result, std::move(details), true});
    if (result == ERROR_SUCCESS && valueType) *valueType = wlan_opcode_value_type_query_only;
    return result;
}

DWORD WlanRegisterNotification(HANDLE handle, DWORD sources, BOOL /*ignoreDuplicate*/,
                               WLAN_NOTIFICATION_CALLBACK callback, PVOID context, PVOID reserved,
                               PDWORD previousSources) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    const DWORD admitted = admit(machine, handle, "WlanRegisterNotification");
    if (admitted != ERROR_SUCCESS) return admitted;
    if (reserved) return ERROR_INVALID_PARAMETER;
    const bool listens = sources != WLAN_NOTIFICATION_SOURCE_NONE && callback;
    const DWORD previous = listens
                               ? machine->notifications().registerCallback(handle, sources, callback, context)
                               : machine->notifications().unregister(handle);
    if (previousSources) *previousSources = previous;
    return ERROR_SUCCESS;
}

DWORD WlanIhvControl(HANDLE handle, const GUID* guid, WLAN_IHV_CONTROL_TYPE type, DWORD inSize,
                     PVOID inBuffer, DWORD outSize, PVOID outBuffer, PDWORD bytesReturned) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    if (!machine) return kServiceNotActive;
    const IhvCall call{handle, guid, type, block<const std::uint8_t>(inBuffer, inSize),
                       block<std::uint8_t>(outBuffer, outSize)};
    Json::Value details;
    details["type"] = static_cast<int>(type);
    details["inHex"] = vexa::simulation::hexText(call.request);
    details["outSize"] = Json::Value::UInt{outSize};
    const DWORD result = ihvControl(*machine, call, bytesReturned);
    machine->calls().add({"WlanIhvControl", machine->elapsed(), result, std::move(details), false});
    return result;
}
