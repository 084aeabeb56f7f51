#pragma once

#include <filesystem>
#include <string>

#include "contract/Store.h"

namespace vexa::client {

/// The folder of a simulated machine, or what stands for it on a real one, as far as the client has to do
/// with it.
class MachineFolder {
public:
    /// `path` empty: the machine of the environment, or the user's default one; always so on a real machine.
    explicit MachineFolder(const std::string& path);

    /// A new folder below the temporary one, for the owner only.
    static MachineFolder makeTemporary();

    const std::filesystem::path& path() const { return m_path; }
    std::filesystem::path portsFile() const { return m_path / "ports.json"; }
    std::filesystem::path outputFile() const { return m_path / "stdout.log"; }
    /// The scenario of the machine, if none is named.
    std::filesystem::path registryFile() const { return m_path / "registry.json"; }
    std::filesystem::path configFile() const { return storeFolder() / contract::kConfigFile; }

    /// Where the service writes its diagnostic log.
    std::filesystem::path dumpFolder() const { return storeFolder() / contract::kDumpFolder; }

    /// Makes the folder, and those above it that are missing, for the owner only. Throws ClientError.
    void create() const;

private:
    std::filesystem::path storeFolder() const;

    std::filesystem::path m_path;
};

/// Removes the folder with all that is in it when it goes.
class TemporaryMachine {
public:
    TemporaryMachine();
    ~TemporaryMachine();
    TemporaryMachine(const TemporaryMachine&) = delete;
    TemporaryMachine& operator=(const TemporaryMachine&) = delete;

    const std::filesystem::path& path() const { return m_folder.path(); }

private:
    MachineFolder m_folder;
};

}  // namespace vexa::client
