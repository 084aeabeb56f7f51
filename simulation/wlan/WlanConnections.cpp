// The functions of the WLAN service that make and end connections.

#include <algorithm>
#include <span>

#include "platform/WlanApi.h"
#include "simulation/parts/ReasonTexts.h"
#include "simulation/wlan/ServiceEntry.h"
#include "text/TextConversion.h"

namespace {

using vexa::simulation::admit;
using vexa::simulation::Bytes;
using vexa::simulation::ConnectionWish;
using vexa::simulation::kServiceNotActive;
using vexa::simulation::Machine;
using vexa::simulation::MachineCode;

// Empty where there is none, or none that can be.
Bytes ssidOf(const WLAN_CONNECTION_PARAMETERS& parameters) {
    const DOT11_SSID* const ssid = parameters.pDot11Ssid;
    if (!ssid || ssid->uSSIDLength > DOT11_SSID_MAX_LENGTH) return {};
    const auto bytes = std::span(ssid->ucSSID).first(ssid->uSSIDLength);
    return {bytes.begin(), bytes.end()};
}

std::string profileText(LPCWSTR profile) {
    return vexa::utf8FromUtf16(reinterpret_cast<const char16_t*>(profile));
}

// A profile that is wrong, or none; the network that is wanted otherwise.
DWORD readWish(const WLAN_CONNECTION_PARAMETERS& parameters, ConnectionWish& wish) {
    const WLAN_CONNECTION_MODE mode = parameters.wlanConnectionMode;
    if (mode == wlan_connection_mode_temporary_profile && parameters.strProfile) {
        auto profile = vexa::simulation::readProfile(profileText(parameters.strProfile));
        if (!profile) return ERROR_BAD_PROFILE;
        wish = wishFor(*std::move(profile));
        return ERROR_SUCCESS;
    }
    const bool isDiscovery =
        mode == wlan_connection_mode_discovery_secure || mode == wlan_connection_mode_discovery_unsecure;
    const Bytes ssid = ssidOf(parameters);
    if (!isDiscovery || ssid.empty()) return ERROR_INVALID_PARAMETER;
    wish = vexa::simulation::wishFor(mode, ssid);
    return ERROR_SUCCESS;
}

DWORD connect(Machine& machine, HANDLE client, const GUID* guid,
              const WLAN_CONNECTION_PARAMETERS* parameters) {
    const DWORD admitted = admit(&machine, client, "WlanConnect");
    if (admitted != ERROR_SUCCESS) return admitted;
    if (!guid || !parameters) return ERROR_INVALID_PARAMETER;
    const auto adapter = machine.adapters().findInserted(*guid);
    if (!adapter) return ERROR_NOT_FOUND;
    ConnectionWish wish;
    const DWORD result = readWish(*parameters, wish);
    return result == ERROR_SUCCESS ? machine.connections().connect(*adapter, std::move(wish)) : result;
}

DWORD disconnect(Machine& machine, HANDLE client, const GUID* guid) {
    const DWORD admitted = admit(&machine, client, "WlanDisconnect");
    if (admitted != ERROR_SUCCESS) return admitted;
    if (!guid) return ERROR_INVALID_PARAMETER;
    const auto adapter = machine.adapters().findInserted(*guid);
    if (!adapter) return ERROR_NOT_FOUND;
    machine.connections().disconnect(*adapter);
    return ERROR_SUCCESS;
}

Json::Value detailsOf(const WLAN_CONNECTION_PARAMETERS* parameters) {
    Json::Value details;
    details["mode"] = parameters ? static_cast<int>(parameters->wlanConnectionMode) : 0;
    details["flags"] = parameters ? Json::Value::UInt{parameters->dwFlags} : 0;
    details["profile"] = Json::Value();
    details["ssid"] = Json::Value();
    if (parameters && parameters->strProfile) details["profile"] = profileText(parameters->strProfile);
    if (parameters && parameters->pDot11Ssid)
        details["ssid"] = vexa::simulation::textOfBytes(ssidOf(*parameters));
    return details;
}

}  // namespace

DWORD WlanConnect(HANDLE handle, const GUID* guid, PWLAN_CONNECTION_PARAMETERS parameters, PVOID reserved) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    if (!machine) return kServiceNotActive;
    if (reserved) return ERROR_INVALID_PARAMETER;
    Json::Value details = detailsOf(parameters);
    const auto at = machine->elapsed();
    const DWORD result = connect(*machine, handle, guid, parameters);
    machine->calls().add({"WlanConnect", at, result, std::move(details), false});
    return result;
}

DWORD WlanDisconnect(HANDLE handle, const GUID* guid, PVOID reserved) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    if (!machine) return kServiceNotActive;
    if (reserved) return ERROR_INVALID_PARAMETER;
    const auto at = machine->elapsed();
    const DWORD result = disconnect(*machine, handle, guid);
    machine->calls().add({"WlanDisconnect", at, result, Json::Value(Json::objectValue), false});
    return result;
}

DWORD WlanReasonCodeToString(DWORD reason, DWORD size, LPWSTR buffer, PVOID reserved) {
    const MachineCode here;
    Machine* const machine = Machine::current();
    if (!machine) return kServiceNotActive;
    if (const auto error = machine->faults().nextError("WlanReasonCodeToString")) return *error;
    if (reserved || !buffer || size == 0) return ERROR_INVALID_PARAMETER;
    const auto text = vexa::simulation::reasonText(reason).substr(0, size - 1);
    *std::copy(text.begin(), text.end(), buffer) = u'\0';
    return ERROR_SUCCESS;
}
