#pragma once

#include <filesystem>
#include <string_view>

namespace vexa::contract {

// Where the service keeps its configuration and its logs, and what it begins with.

inline constexpr const char* kRoamingFolder = "Roaming";
inline constexpr const char* kMakerFolder = "Korvane";
inline constexpr const char* kConfigFile = "config.xml";
inline constexpr const char* kDumpFolder = "Dump";

/// Below the folder that all accounts share.
inline std::filesystem::path storeFolder(const std::filesystem::path& publicFolder) {
    return publicFolder / kRoamingFolder / kMakerFolder;
}

/// The configuration of a machine that has none: no credentials, no log.
inline constexpr std::string_view kDefaultDocument =
    "\xEF\xBB\xBF<?xml version=\"1.0\" encoding=\"UTF-8\"?><configurations>\t<global>\t\t"
    "<dump_file_path>hs20log.txt</dump_file_path>\t\t<create_new_dump_file>true</create_new_dump_file>\t\t"
    "<autoconnect>true</autoconnect>\t\t<enabledump>false</enabledump>\t\t<dumplevel>0</dumplevel>\t\t"
    "<homerealm></homerealm>\t\t<nextcredid>1</nextcredid>\t</global>\t<credentials>\t</credentials>\t"
    "<users>\t</users></configurations>";

}  // namespace vexa::contract
