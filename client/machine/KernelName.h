#pragma once

#include <memory>
#include <string>

namespace vexa::client {

/// Keeps a name as long as it exists; null: it has none.
using NameHolder = std::shared_ptr<void>;

/// Takes a name of this host that only one process can have. It is no file: it goes with its holder, however
/// that ends. Null if somebody has it.
NameHolder takeKernelName(const std::string& name);

/// Tells the account of this process apart from others in such names.
std::string accountTag();

}  // namespace vexa::client
