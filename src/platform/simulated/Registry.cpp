#include "platform/Registry.h"

#include "simulation/Machine.h"
#include "text/TextConversion.h"

namespace vexa::platform {

struct RegistryKey::State {
    simulation::MachineRegistry& registry;
    RegistryRoot root;
    std::string path;
};

std::optional<RegistryKey> RegistryKey::open(RegistryRoot root, const std::string& path) {
    simulation::Machine* const machine = simulation::Machine::current();
    if (!machine || !machine->registry().hasKey(root, path)) return std::nullopt;
    return RegistryKey(std::make_unique<State>(State{machine->registry(), root, path}));
}

RegistryKey::RegistryKey(std::unique_ptr<State> state) : m_state(std::move(state)) {}
RegistryKey::~RegistryKey() = default;
RegistryKey::RegistryKey(RegistryKey&&) noexcept = default;
RegistryKey& RegistryKey::operator=(RegistryKey&&) noexcept = default;

std::optional<std::string> RegistryKey::subkeyName(std::uint32_t index, std::size_t capacity) const {
    const auto names = m_state->registry.subkeys(m_state->root, m_state->path);
    if (index >= names.size()) return std::nullopt;
    return names[index].size() < capacity ? names[index] : std::string();
}

std::optional<std::string> RegistryKey::value(const std::string& name, std::size_t capacity) const {
    auto content = m_state->registry.value(m_state->root, m_state->path, name);
    if (!content || content->size() >= capacity) return std::nullopt;
    return content->substr(0, content->find('\0'));
}

std::optional<std::wstring> RegistryKey::wideValue(const std::string& name, std::size_t capacity) const {
    const auto content = m_state->registry.value(m_state->root, m_state->path, name);
    if (!content) return std::nullopt;
    const std::wstring text = wideFromNarrow(*content);
    if ((text.size() + 1) * sizeof(char16_t) > capacity) return std::nullopt;
    return text.substr(0, text.find(L'\0'));
}

bool writeRegistryNumber(const std::string& path, const std::string& name, std::uint32_t number) {
    simulation::Machine* const machine = simulation::Machine::current();
    return machine != nullptr && machine->registry().setNumber(path, name, number);
}

}  // namespace vexa::platform
