#pragma once

#include <string_view>

namespace vexa::simulation {

/// The steps of the service's files, which fail on request.
inline constexpr std::string_view kFileCalls[] = {"CreateDirectory", "open", "write", "sync", "rename"};

}  // namespace vexa::simulation
