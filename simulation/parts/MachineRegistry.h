#pragma once

#include <json/value.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "platform/Mutex.h"
#include "platform/Registry.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::simulation {

/// The registry: the class key of the network adapters, from the scenario, and what the current user's part
/// of the file `registry.json` holds. Names are compared without regard to case. Any thread.
class MachineRegistry {
public:
    MachineRegistry(const std::vector<ClassKeyEntry>& classKey, std::filesystem::path file);

    bool hasKey(platform::RegistryRoot root, const std::string& path) const;
    std::vector<std::string> subkeys(platform::RegistryRoot root, const std::string& path) const;

    /// The bytes of a value as the narrow interface gives them, without a terminator; nothing if it is
    /// missing.
    std::optional<std::string> value(platform::RegistryRoot root, const std::string& path,
                                     const std::string& name) const;

    /// Sets or removes the user's choice whether hotspots are joined by themselves. False if the file can't
    /// be written.
    bool setAutoConnect(const std::optional<std::string>& text);

    /// Sets a number below the current user's part; the key is created at need. False if the file can't be
    /// written.
    bool setNumber(const std::string& path, const std::string& name, std::uint32_t number);

    /// The content of the file.
    Json::Value content() const;

private:
    Json::Value keysOf(platform::RegistryRoot root) const REQUIRES(m_mutex);
    Json::Value readContent() const REQUIRES(m_mutex);

    const Json::Value m_localMachine;
    const std::filesystem::path m_file;
    mutable platform::Mutex m_mutex;  // the file
};

}  // namespace vexa::simulation
