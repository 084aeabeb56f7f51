#include "client/demo/DemoMachine.h"

#include <filesystem>
#include <string>
#include <string_view>

#include "client/machine/OwnerFile.h"
#include "client/terminal/ClientError.h"
#include "contract/Store.h"

namespace vexa::client {

namespace {

// The story quotes the reasons that the log tells.
std::string configurationWithLog() {
    static constexpr std::string_view kOff = "<enabledump>false";
    std::string text(contract::kDefaultDocument);
    text.replace(text.find(kOff), kOff.size(), "<enabledump>true");
    return text;
}

}  // namespace

StartRequest prepareDemoMachine(const TemporaryMachine& temporary) {
    StartRequest request;
    request.machine = temporary.path().string();
    request.builtInScenario = true;
    const MachineFolder machine(request.machine);
    std::error_code error;
    std::filesystem::create_directories(machine.configFile().parent_path(), error);
    if (error || !replaceOwnerFile(machine.configFile(), configurationWithLog()))
        throw ClientError("the machine of the demo cannot be written to " + machine.path().string(),
                          kExitNotStarted);
    return request;
}

}  // namespace vexa::client
