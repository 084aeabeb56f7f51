#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace vexa {

/// The text of one event for the client, stamped with the present local time. `data` is text too, often JSON
/// in the styled form; without it the event has no `Data`.
std::string buildEnvelope(std::string_view eventId, std::string_view source,
                          const std::optional<std::string_view>& data = std::nullopt);

/// The same for data that is written straight into it: `appendData` appends it as a string in quotes, of
/// about this size.
std::string buildEnvelope(std::string_view eventId, std::string_view source, std::size_t usualSize,
                          const std::function<void(std::string&)>& appendData);

}  // namespace vexa
