#include "client/machine/LogSwitch.h"

#include <pugixml.hpp>

namespace vexa::client {

std::string whyLogIsOff(const MachineFolder& machine) {
    pugi::xml_document document;
    const auto result = document.load_file(machine.configFile().c_str());
    if (result.status == pugi::status_file_not_found)
        return "no service has run on the machine " + machine.path().string() + " yet";
    if (result.status != pugi::status_ok) return machine.configFile().string() + " cannot be read";
    const std::string enabled = document.select_node("/*/global/enabledump").node().text().get();
    if (enabled == "true") return "";
    return "the log is off: set enabledump to true in " + machine.configFile().string() +
           " and start the service again";
}

}  // namespace vexa::client
