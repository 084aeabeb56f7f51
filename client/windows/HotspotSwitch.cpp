#include "client/HotspotSwitch.h"

#include <string>

#include "base/TextConversion.h"
#include "platform/Registry.h"
#include "platform/windows/Handle.h"

namespace vexa::client {

namespace {

constexpr const char* kKey = "Software\\Korvane\\Vexa";
constexpr const char* kValue = "IsHotSpotAutoConnect";
constexpr std::size_t kMaxBytes = 260;

using Key = platform::Owned<HKEY, &::RegCloseKey>;

}  // namespace

bool readHotspotSwitch(const MachineFolder& /*machine*/) {
    const auto key = platform::RegistryKey::open(platform::RegistryRoot::CurrentUser, kKey);
    const auto text = key ? key->wideValue(kValue, kMaxBytes) : std::nullopt;
    return !text || compareNoCase(*text, L"false") != 0;
}

bool writeHotspotSwitch(const MachineFolder& machine, bool isOn) {
    if (readHotspotSwitch(machine) == isOn) return true;
    Key key;
    if (RegCreateKeyExW(HKEY_CURRENT_USER, wideFromNarrow(kKey).c_str(), 0, nullptr, 0, KEY_SET_VALUE,
                        nullptr, key.receive(), nullptr) != ERROR_SUCCESS)
        return false;
    const std::wstring text = isOn ? L"true" : L"false";
    return RegSetValueExW(key.get(), wideFromNarrow(kValue).c_str(), 0, REG_SZ,
                          reinterpret_cast<const BYTE*>(text.c_str()),
                          static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t))) == ERROR_SUCCESS;
}

}  // namespace vexa::client
