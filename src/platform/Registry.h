#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

namespace vexa::platform {

enum class RegistryRoot { LocalMachine, CurrentUser };

/// An open key of the registry, read through the narrow interface.
class RegistryKey {
public:
    /// Nothing if the key can't be opened.
    static std::optional<RegistryKey> open(RegistryRoot root, const std::string& path);
    ~RegistryKey();
    RegistryKey(RegistryKey&&) noexcept;
    RegistryKey& operator=(RegistryKey&&) noexcept;

    /// The name of subkey `index`, counted from 0; nothing past the last, empty if it is too long for
    /// `capacity` bytes with its terminator.
    std::optional<std::string> subkeyName(std::uint32_t index, std::size_t capacity) const;

    /// The content of a value of any type, up to its first NUL; nothing if it is missing or doesn't fit
    /// `capacity` bytes with its terminator.
    std::optional<std::string> value(const std::string& name, std::size_t capacity) const;

    /// The same in wide characters; `capacity` is in bytes of 16-bit characters.
    std::optional<std::wstring> wideValue(const std::string& name, std::size_t capacity) const;

private:
    struct State;
    explicit RegistryKey(std::unique_ptr<State> state);
    std::unique_ptr<State> m_state;
};

/// Sets a number (REG_DWORD) in a key of the current user, which is created if it is missing. False if that
/// fails.
bool writeRegistryNumber(const std::string& path, const std::string& name, std::uint32_t number);

}  // namespace vexa::platform
