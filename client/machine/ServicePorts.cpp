#include "client/machine/ServicePorts.h"

#include <json/json.h>

#include <fstream>

#include "client/machine/OwnerFile.h"
#include "client/port/JsonLine.h"

namespace vexa::client {

namespace {

std::optional<std::uint16_t> portMember(const Json::Value& object, const char* name) {
    const Json::Value& value = object[name];
    if (!value.isUInt() || value.asUInt() > 0xFFFF) return std::nullopt;
    return static_cast<std::uint16_t>(value.asUInt());
}

}  // namespace

std::string portsAsText(const ServicePorts& ports) {
    return "sa=" + std::to_string(ports.sa) + " hs20=" + std::to_string(ports.hs20) +
           " control=" + std::to_string(ports.control);
}

Json::Value portsJson(const ServicePorts& ports) {
    Json::Value object(Json::objectValue);
    object["sa"] = ports.sa;
    object["hs20"] = ports.hs20;
    object["control"] = ports.control;
    return object;
}

bool writePortsFile(const std::filesystem::path& file, const ServicePorts& ports) {
    return replaceOwnerFile(file, jsonLine(portsJson(ports)) + "\n");
}

std::optional<ServicePorts> readPortsFile(const std::filesystem::path& file) {
    std::ifstream input(file);
    if (!input) return std::nullopt;
    const std::string text{std::istreambuf_iterator<char>(input), std::istreambuf_iterator<char>()};
    const auto object = parseJsonObject(text);
    if (!object) return std::nullopt;
    const auto sa = portMember(*object, "sa");
    const auto hs20 = portMember(*object, "hs20");
    const auto control = portMember(*object, "control");
    if (!sa || !hs20 || !control) return std::nullopt;
    return ServicePorts{*sa, *hs20, *control};
}

}  // namespace vexa::client
