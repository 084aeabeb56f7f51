#pragma once

#include <filesystem>

namespace vexa::posix {

/// The folder of the simulated machine that this process runs on or talks to, as the environment names it.
/// Need not exist; empty if the environment tells nothing.
std::filesystem::path machineFolder();

}  // namespace vexa::posix
