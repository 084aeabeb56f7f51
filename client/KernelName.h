#pragma once

#include <string>

#include "client/Descriptor.h"

namespace vexa::client {

/// Takes a name of this host that only one process can have. It is no file: it goes with its holder, however
/// that ends. No descriptor if somebody has it.
Descriptor takeKernelName(const std::string& name);

}  // namespace vexa::client
