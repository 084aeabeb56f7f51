#pragma once

#include <string_view>

namespace vexa {

/// Whether the `Host` of a request names this machine's loopback.
bool isLoopbackHost(std::string_view host);

}  // namespace vexa
