#pragma once

#include <json/value.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>

namespace vexa::client {

/// The ports of one service. `control` 0: it has no control channel.
struct ServicePorts {
    std::uint16_t sa = 0;
    std::uint16_t hs20 = 0;
    std::uint16_t control = 0;
};

/// `sa=N hs20=N control=N`
std::string portsAsText(const ServicePorts& ports);

/// An object with these three names.
Json::Value portsJson(const ServicePorts& ports);

/// The ports of the running service, left in its machine's folder by its parent so that the other commands
/// find them. False if the file cannot be written.
bool writePortsFile(const std::filesystem::path& file, const ServicePorts& ports);

/// Nothing if there is no such file or it holds something else.
std::optional<ServicePorts> readPortsFile(const std::filesystem::path& file);

}  // namespace vexa::client
