#include "client/HotspotSwitch.h"

#include <json/value.h>
#include <strings.h>

#include "client/JsonLine.h"
#include "client/OwnerFile.h"
#include "client/posix/RegistryFile.h"

namespace vexa::client {

namespace {

constexpr const char* kValue = "IsHotSpotAutoConnect";

}  // namespace

bool readHotspotSwitch(const MachineFolder& machine) {
    const Json::Value registry = readRegistry(machine);
    const Json::Value& values = registry[kVexaKey];
    if (!values.isObject() || !values[kValue].isString()) return true;
    return ::strcasecmp(values[kValue].asCString(), "false") != 0;
}

bool writeHotspotSwitch(const MachineFolder& machine, bool isOn) {
    if (readHotspotSwitch(machine) == isOn) return true;
    Json::Value registry = readRegistry(machine);
    Json::Value& values = registry[kVexaKey];
    if (!values.isObject()) values = Json::Value(Json::objectValue);
    values[kValue] = isOn ? "true" : "false";
    return replaceOwnerFile(machine.registryFile(), jsonLine(registry) + "\n");
}

}  // namespace vexa::client
