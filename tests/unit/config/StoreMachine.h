#pragma once

#include <filesystem>
#include <string>
#include <string_view>

#include "base/NetworkListLock.h"
#include "config/Config.h"
#include "unit/simulation/TestMachine.h"

namespace vexa::test {

/// A machine with one user and the folder of the store, and ways to write and read its files by hand.
class StoreMachine {
public:
    explicit StoreMachine(const std::string& user = "PC\\\\alice");

    simulation::TestMachine& machine() { return m_machine; }

    /// Public/Roaming/Korvane
    std::filesystem::path folder();
    std::filesystem::path configFile() { return folder() / "config.xml"; }

    void write(const std::string& name, std::string_view content);
    std::string read(const std::string& name);
    std::string config() { return read("config.xml"); }

    /// The names of everything in the folder, sorted, joined by blanks.
    std::string listing();

private:
    simulation::TestMachine m_machine;
};

/// Finds the paths and reads the file. The result of what failed, or kSuccess.
ResultCode open(Config& config, bool* isChanged = nullptr) REQUIRES(g_hs20Lock);

/// The table as text: "3:1 1:2" for id 3 in place 1 and id 1 in place 2.
std::string places(Config& config) REQUIRES(g_hs20Lock);

/// A configuration with these sections; `global` replaces the usual keys.
std::string document(const std::string& credentials, const std::string& users,
                     const std::string& global = "<nextcredid>10</nextcredid>");

/// One `credential` element.
std::string ttls(int id, const std::string& realm, const std::string& creator = "PC\\alice",
                 const std::string& access = "alluser");

/// One `user` element with ids and priorities as in "3:1 1:2".
std::string user(const std::string& name, const std::string& places);

}  // namespace vexa::test
