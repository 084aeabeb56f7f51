#include "client/MachineRegistry.h"

#include <fstream>
#include <iterator>

#include "client/JsonLine.h"
#include "client/posix/RegistryFile.h"

namespace vexa::client {

namespace {

constexpr const char* kMethodValue = "EapMethod";

}  // namespace

Json::Value readRegistry(const MachineFolder& machine) {
    std::ifstream input(machine.registryFile());
    const std::string text{std::istreambuf_iterator<char>(input), std::istreambuf_iterator<char>()};
    return parseJsonObject(text).value_or(Json::Value(Json::objectValue));
}

std::optional<int> readConnectionMethod(const MachineFolder& machine) {
    const Json::Value registry = readRegistry(machine);
    const Json::Value& values = registry[kVexaKey];
    if (!values.isObject() || !values[kMethodValue].isInt()) return std::nullopt;
    return values[kMethodValue].asInt();
}

}  // namespace vexa::client
