#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace vexa {

// What goes from a server to its clients, in WebSocket's frames: whole and unmasked, so that all clients get
// the same bytes.

std::string textFrame(std::string_view message);
std::string closeFrame(std::uint16_t code);

bool isPongFrame(std::string_view frame);
bool isCloseFrame(std::string_view frame);

}  // namespace vexa
