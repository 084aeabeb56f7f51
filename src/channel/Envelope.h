#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace vexa {

/// The text of one event for the client, stamped with the present local time. `data` is text too, often JSON
/// in the styled form; without it the event has no `Data`.
std::string buildEnvelope(std::string_view eventId, std::string_view source,
                          const std::optional<std::string_view>& data = std::nullopt);

}  // namespace vexa
