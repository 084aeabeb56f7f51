#include "client/machine/MachineRegistry.h"

#include <string>

#include "contract/Registry.h"
#include "platform/Registry.h"
#include "platform/windows/Handle.h"
#include "text/TextConversion.h"

namespace vexa::client {

namespace {

using contract::kEapMethodValue;
using contract::kHotspotSwitchValue;
using contract::kProductKey;

constexpr std::size_t kMaxBytes = 260;

using Key = platform::Owned<HKEY, &::RegCloseKey>;

}  // namespace

bool readHotspotSwitch(const MachineFolder& /*machine*/) {
    const auto key = platform::RegistryKey::open(platform::RegistryRoot::CurrentUser, kProductKey);
    const auto text = key ? key->wideValue(kHotspotSwitchValue, kMaxBytes) : std::nullopt;
    return !text || compareNoCase(*text, L"false") != 0;
}

bool writeHotspotSwitch(const MachineFolder& machine, bool isOn) {
    if (readHotspotSwitch(machine) == isOn) return true;
    Key key;
    if (RegCreateKeyExW(HKEY_CURRENT_USER, wideFromNarrow(kProductKey).c_str(), 0, nullptr, 0, KEY_SET_VALUE,
                        nullptr, key.receive(), nullptr) != ERROR_SUCCESS)
        return false;
    const std::wstring text = isOn ? L"true" : L"false";
    return RegSetValueExW(key.get(), wideFromNarrow(kHotspotSwitchValue).c_str(), 0, REG_SZ,
                          reinterpret_cast<const BYTE*>(text.c_str()),
                          static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t))) == ERROR_SUCCESS;
}

std::optional<int> readConnectionMethod(const MachineFolder& /*machine*/) {
    DWORD method = 0;
    DWORD size = sizeof method;
    if (RegGetValueW(HKEY_CURRENT_USER, wideFromNarrow(kProductKey).c_str(),
                     wideFromNarrow(kEapMethodValue).c_str(), RRF_RT_REG_DWORD, nullptr, &method,
                     &size) != ERROR_SUCCESS)
        return std::nullopt;
    return static_cast<int>(method);
}

}  // namespace vexa::client
