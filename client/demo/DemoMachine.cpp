#include "client/demo/DemoMachine.h"

#include <filesystem>

#include "client/machine/OwnerFile.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

// The story quotes the reasons that the log tells.
constexpr const char* kConfigWithLog =
    R"(<?xml version="1.0" encoding="UTF-8"?><configurations><global><dump_file_path>hs20log.txt</dump_file_path>)"
    R"(<create_new_dump_file>false</create_new_dump_file><autoconnect>true</autoconnect>)"
    R"(<enabledump>true</enabledump><dumplevel>0</dumplevel><homerealm></homerealm><nextcredid>1</nextcredid>)"
    R"(</global><credentials></credentials><users></users></configurations>)";

}  // namespace

void prepareDemoMachine(const MachineFolder& machine) {
    std::error_code error;
    std::filesystem::create_directories(machine.configFile().parent_path(), error);
    if (error || !replaceOwnerFile(machine.configFile(), kConfigWithLog))
        throw ClientError("the machine of the demo cannot be written to " + machine.path().string(),
                          kExitNotStarted);
}

}  // namespace vexa::client
