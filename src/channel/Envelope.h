#pragma once

#include <optional>
#include <string>

namespace vexa {

/// The text of one event for the client, stamped with the present local time. `data` is text too, often JSON
/// in the styled form; without it the event has no `Data`.
std::string buildEnvelope(const std::string& eventId, const char* source,
                          std::optional<std::string> data = std::nullopt);

}  // namespace vexa
