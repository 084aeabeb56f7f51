#include "simulation/windows/SystemRegistry.h"

#include <windows.h>

#include <array>
#include <cstdio>
#include <cstring>

#include "contract/Registry.h"
#include "platform/windows/Handle.h"
#include "text/TextConversion.h"

namespace vexa::simulation {

namespace {

using Key = platform::Owned<HKEY, &::RegCloseKey>;

Key create(HKEY parent, const char* path) {
    Key key;
    RegCreateKeyExW(parent, wideFromNarrow(path).c_str(), 0, nullptr, 0, KEY_ALL_ACCESS, nullptr,
                    key.receive(), nullptr);
    return key;
}

bool setText(const Key& key, const wchar_t* name, const std::string& utf8) {
    const std::wstring text = wideFromUtf8(utf8);
    return RegSetValueExW(key.get(), name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text.c_str()),
                          static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t))) == ERROR_SUCCESS;
}

bool writeEntry(const Key& classKey, std::size_t index, const ClassKeyEntry& entry) {
    std::array<char, 16> name{};
    std::snprintf(name.data(), name.size(), "%04u", static_cast<unsigned>(index));
    const Key key = create(classKey.get(), name.data());
    return key && (!entry.netCfgInstanceId || setText(key, L"NetCfgInstanceId", *entry.netCfgInstanceId)) &&
           (!entry.matchingDeviceId || setText(key, L"MatchingDeviceId", *entry.matchingDeviceId));
}

struct Value {
    std::wstring name;
    DWORD type;
    std::vector<BYTE> content;
};

/// Nothing past the last one.
std::optional<Value> valueAt(const Key& key, DWORD index) {
    std::array<wchar_t, 256> name{};
    std::vector<BYTE> content(65536);
    auto nameLength = static_cast<DWORD>(name.size());
    auto size = static_cast<DWORD>(content.size());
    DWORD type = REG_NONE;
    if (RegEnumValueW(key.get(), index, name.data(), &nameLength, nullptr, &type, content.data(), &size) !=
        ERROR_SUCCESS)
        return std::nullopt;
    content.resize(size);
    return Value{{name.data(), nameLength}, type, std::move(content)};
}

/// Text or number; null for anything else.
Json::Value jsonOf(const Value& value) {
    if (value.type == REG_DWORD && value.content.size() == sizeof(std::uint32_t)) {
        std::uint32_t number = 0;
        std::memcpy(&number, value.content.data(), sizeof number);
        return number;
    }
    if (value.type != REG_SZ) return {};
    std::wstring text(value.content.size() / sizeof(wchar_t), L'\0');
    std::memcpy(text.data(), value.content.data(), text.size() * sizeof(wchar_t));
    return utf8FromWide(text.substr(0, text.find(L'\0')));
}

}  // namespace

bool writeClassKey(const std::vector<ClassKeyEntry>& entries) {
    RegDeleteTreeW(HKEY_LOCAL_MACHINE, wideFromNarrow(contract::kNetworkAdapterClassKey).c_str());
    const Key classKey = create(HKEY_LOCAL_MACHINE, contract::kNetworkAdapterClassKey);
    bool isWritten = static_cast<bool>(classKey);
    for (std::size_t i = 0; i < entries.size() && isWritten; ++i)
        isWritten = writeEntry(classKey, i, entries[i]);
    return isWritten;
}

bool writeAutoConnect(const std::optional<std::string>& text) {
    const Key key = create(HKEY_CURRENT_USER, contract::kProductKey);
    if (!key) return false;
    const std::wstring name = wideFromNarrow(contract::kHotspotSwitchValue);
    if (text) return setText(key, name.c_str(), *text);
    const auto result = RegDeleteValueW(key.get(), name.c_str());
    return result == ERROR_SUCCESS || result == ERROR_FILE_NOT_FOUND;
}

Json::Value readProductKey() {
    Json::Value keys(Json::objectValue);
    Key key;
    if (RegOpenKeyExW(HKEY_CURRENT_USER, wideFromNarrow(contract::kProductKey).c_str(), 0, KEY_READ,
                      key.receive()) != ERROR_SUCCESS)
        return keys;
    Json::Value& values = keys[contract::productKeyPath()] = Json::Value(Json::objectValue);
    for (DWORD index = 0; const auto value = valueAt(key, index); ++index)
        values[utf8FromWide(value->name)] = jsonOf(*value);
    return keys;
}

}  // namespace vexa::simulation
