#include "base/AdapterIdentity.h"

#include <array>
#include <optional>
#include <string>
#include <string_view>

#include "base/WlanHandle.h"
#include "base/WlanMemory.h"
#include "contract/Registry.h"
#include "platform/Guid.h"
#include "platform/Registry.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::RegistryKey;
using platform::RegistryRoot;

constexpr std::size_t kRegistryBuffer = 256;
constexpr std::array<std::string_view, 2> kVendorPrefixes = {"pci\\ven_1f5d", "usb\\vid_2b7e"};
constexpr std::size_t kPrefixLength = kVendorPrefixes[0].size();
static_assert(kVendorPrefixes[1].size() == kPrefixLength);

bool isVendorHardware(std::string_view hardwareId) {
    if (hardwareId.size() < kPrefixLength) return false;
    for (const std::string_view prefix : kVendorPrefixes)
        if (compareNoCase(hardwareId.substr(0, kPrefixLength), prefix) == 0) return true;
    return false;
}

bool isVendorInstance(const std::string& path, const GUID& guid) {
    const auto key = RegistryKey::open(RegistryRoot::LocalMachine, path);
    if (!key) return false;
    const auto instanceId = key->value("NetCfgInstanceId", kRegistryBuffer);
    if (!instanceId || compareGuidText(*instanceId, guid) != 0) return false;
    const auto hardwareId = key->value("MatchingDeviceId", kRegistryBuffer);
    return hardwareId && isVendorHardware(*hardwareId);
}

}  // namespace

bool isAdapterPresent(HANDLE hWlan, GUID& interfaceGuid) {
    if (hWlan == nullptr || hWlan == INVALID_HANDLE_VALUE) return false;
    PWLAN_INTERFACE_INFO_LIST interfaces = nullptr;
    if (WlanEnumInterfaces(hWlan, nullptr, &interfaces) != ERROR_SUCCESS) return false;
    const WlanMemory<WLAN_INTERFACE_INFO_LIST> owner(interfaces);
    const WLAN_INTERFACE_INFO* const first = interfaces->InterfaceInfo;
    for (DWORD i = 0; i < interfaces->dwNumberOfItems; ++i) {
        if (!isVendorInterface(first[i].InterfaceGuid)) continue;
        interfaceGuid = first[i].InterfaceGuid;
        return true;
    }
    return false;
}

std::optional<GUID> presentAdapter() {
    WlanHandle handle;
    if (handle.open() != ERROR_SUCCESS) return std::nullopt;
    GUID guid{};
    return isAdapterPresent(handle.get(), guid) ? std::optional(guid) : std::nullopt;
}

bool isVendorInterface(const GUID& guid) {
    const auto classKey = RegistryKey::open(RegistryRoot::LocalMachine, contract::kNetworkAdapterClassKey);
    if (!classKey) return false;
    for (std::uint32_t index = 0;; ++index) {
        const auto name = classKey->subkeyName(index, kRegistryBuffer);
        if (!name) return false;
        if (!name->empty() &&
            isVendorInstance(std::string(contract::kNetworkAdapterClassKey) + "\\" + *name, guid))
            return true;
    }
}

}  // namespace vexa
