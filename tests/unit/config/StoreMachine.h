#pragma once

#include <filesystem>
#include <functional>
#include <string>
#include <string_view>

#include "config/Config.h"
#include "unit/simulation/TestMachine.h"

namespace vexa::test {

/// A machine with one user and the folder of the store, ways to write and read its files by hand, and the
/// configuration as his service has it. Holds the lock.
class StoreMachine {
public:
    explicit StoreMachine(const std::string& user = "PC\\\\alice");

    simulation::TestMachine& machine() { return m_machine; }
    Config& config() { return m_config; }

    /// Lets calls on the disk fail: as they do on a full one, if nothing else is said.
    void fail(const std::string& call, int skip = 0, int times = 1, int error = 112);

    /// Public/Roaming/Korvane
    std::filesystem::path folder();

    void write(const std::string& name, std::string_view content);
    std::string read(const std::string& name);
    std::string file() { return read("config.xml"); }

    /// The names of everything in the folder, sorted, joined by blanks.
    std::string listing();

    /// Writes the file, and reads it as a service that starts. What failed, or 0.
    ResultCode openWith(std::string_view content, bool* isChanged = nullptr);

    /// Changes the table in one critical section with what the file says before and the save behind it.
    ResultCode change(const std::function<void(CredentialTable&)>& change);

    /// Stores a credential for this realm.
    ResultCode add(const std::wstring& realm);

    ResultCode save() { return m_config.saveConfig(m_config.lockFile()); }

private:
    simulation::TestMachine m_machine;
    platform::LockGuard<platform::RecursiveMutex> m_lock{g_hs20Lock};
    Config m_config;
};

/// Finds the paths and reads the file. The result of what failed, or kSuccess.
ResultCode open(Config& config, bool* isChanged = nullptr);

/// The table as text: "3:1 1:2" for id 3 in place 1 and id 1 in place 2.
std::string places(const CredentialTable& table);

/// A configuration with these sections; `global` replaces the usual keys.
std::string document(const std::string& credentials, const std::string& users,
                     const std::string& global = "<nextcredid>10</nextcredid>");

/// The same as a save writes it.
std::string saved(const std::string& credentials, const std::string& users,
                  const std::string& global = "<nextcredid>10</nextcredid>");

/// One `credential` element.
std::string ttls(int id, const std::string& realm, const std::string& creator = "PC\\alice",
                 const std::string& access = "alluser");

/// One `user` element with ids and priorities as in "3:1 1:2".
std::string user(const std::string& name, const std::string& places);

}  // namespace vexa::test
