#include "platform/Registry.h"

#include <algorithm>
#include <vector>

#include "platform/windows/Handle.h"
#include "text/TextConversion.h"

namespace vexa::platform {

namespace {

using Key = Owned<HKEY, &::RegCloseKey>;

// Any type, also a number.
constexpr DWORD kAnyType = RRF_RT_ANY;

HKEY handleOf(RegistryRoot root) {
    return root == RegistryRoot::LocalMachine ? HKEY_LOCAL_MACHINE : HKEY_CURRENT_USER;
}

/// Up to the first NUL, or all of it where the value has none.
template <class Char>
std::basic_string<Char> textOf(const std::vector<Char>& content, std::size_t count) {
    const auto end = content.begin() + static_cast<std::ptrdiff_t>(std::min(count, content.size()));
    return {content.begin(), std::find(content.begin(), end, Char{0})};
}

}  // namespace

struct RegistryKey::State {
    Key key;
};

std::optional<RegistryKey> RegistryKey::open(RegistryRoot root, const std::string& path) {
    Key key;
    if (RegOpenKeyExW(handleOf(root), wideFromNarrow(path).c_str(), 0, KEY_READ, key.receive()) !=
        ERROR_SUCCESS)
        return std::nullopt;
    return RegistryKey(std::make_unique<State>(State{std::move(key)}));
}

RegistryKey::RegistryKey(std::unique_ptr<State> state) : m_state(std::move(state)) {}
RegistryKey::~RegistryKey() = default;
RegistryKey::RegistryKey(RegistryKey&&) noexcept = default;
RegistryKey& RegistryKey::operator=(RegistryKey&&) noexcept = default;

std::optional<std::string> RegistryKey::subkeyName(std::uint32_t index, std::size_t capacity) const {
    std::vector<char> name(capacity);
    const LONG result = RegEnumKeyA(m_state->key.get(), index, name.data(), static_cast<DWORD>(capacity));
    if (result == ERROR_MORE_DATA) return std::string();
    return result == ERROR_SUCCESS ? std::optional(textOf(name, capacity)) : std::nullopt;
}

std::optional<std::string> RegistryKey::value(const std::string& name, std::size_t capacity) const {
    std::vector<char> content(capacity);
    auto size = static_cast<DWORD>(capacity);
    if (RegGetValueA(m_state->key.get(), nullptr, name.c_str(), kAnyType, nullptr, content.data(), &size) !=
        ERROR_SUCCESS)
        return std::nullopt;
    return textOf(content, size);
}

std::optional<std::wstring> RegistryKey::wideValue(const std::string& name, std::size_t capacity) const {
    std::vector<wchar_t> content(capacity / sizeof(wchar_t));
    auto size = static_cast<DWORD>(content.size() * sizeof(wchar_t));
    if (RegGetValueW(m_state->key.get(), nullptr, wideFromNarrow(name).c_str(), kAnyType, nullptr,
                     content.data(), &size) != ERROR_SUCCESS)
        return std::nullopt;
    return textOf(content, size / sizeof(wchar_t));
}

bool writeRegistryNumber(const std::string& path, const std::string& name, std::uint32_t number) {
    Key key;
    if (RegCreateKeyExW(HKEY_CURRENT_USER, wideFromNarrow(path).c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                        nullptr, key.receive(), nullptr) != ERROR_SUCCESS)
        return false;
    return RegSetValueExW(key.get(), wideFromNarrow(name).c_str(), 0, REG_DWORD,
                          reinterpret_cast<const BYTE*>(&number), sizeof number) == ERROR_SUCCESS;
}

}  // namespace vexa::platform
