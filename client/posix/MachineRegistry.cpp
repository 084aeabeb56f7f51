#include "client/machine/MachineRegistry.h"

#include <json/value.h>
#include <strings.h>

#include <fstream>
#include <iterator>

#include "client/machine/OwnerFile.h"
#include "client/port/JsonLine.h"
#include "contract/Registry.h"

namespace vexa::client {

namespace {

using contract::kEapMethodValue;
using contract::kHotspotSwitchValue;
using contract::productKeyPath;

// The whole registry of a simulated machine: key paths to values.
Json::Value readRegistry(const MachineFolder& machine) {
    std::ifstream input(machine.registryFile());
    const std::string text{std::istreambuf_iterator<char>(input), std::istreambuf_iterator<char>()};
    return parseJsonObject(text).value_or(Json::Value(Json::objectValue));
}

}  // namespace

bool readHotspotSwitch(const MachineFolder& machine) {
    const Json::Value registry = readRegistry(machine);
    const Json::Value& values = registry[productKeyPath()];
    if (!values.isObject() || !values[kHotspotSwitchValue].isString()) return true;
    return ::strcasecmp(values[kHotspotSwitchValue].asCString(), "false") != 0;
}

bool writeHotspotSwitch(const MachineFolder& machine, bool isOn) {
    if (readHotspotSwitch(machine) == isOn) return true;
    Json::Value registry = readRegistry(machine);
    Json::Value& values = registry[productKeyPath()];
    if (!values.isObject()) values = Json::Value(Json::objectValue);
    values[kHotspotSwitchValue] = isOn ? "true" : "false";
    return replaceOwnerFile(machine.registryFile(), jsonLine(registry) + "\n");
}

std::optional<int> readConnectionMethod(const MachineFolder& machine) {
    const Json::Value registry = readRegistry(machine);
    const Json::Value& values = registry[productKeyPath()];
    if (!values.isObject() || !values[kEapMethodValue].isInt()) return std::nullopt;
    return values[kEapMethodValue].asInt();
}

}  // namespace vexa::client
