#pragma once

#include <optional>
#include <string_view>

#include "platform/WlanApi.h"

namespace vexa::simulation {

/// Reads "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}", in either case; nothing if it isn't of this form.
std::optional<GUID> guidFromText(std::string_view text);

}  // namespace vexa::simulation
