#include "client/import/Base64.h"

#include <cstdint>

namespace vexa::client {

namespace {

constexpr std::string_view kDigits = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
constexpr std::string_view kWhiteSpace = " \t\r\n";

}  // namespace

std::optional<std::string> decodeBase64(std::string_view text) {
    std::string bytes;
    std::uint32_t waiting = 0;  // bits that make no whole byte yet
    unsigned count = 0;         // of them
    std::size_t digits = 0;
    std::size_t padding = 0;
    for (const char character : text) {
        if (kWhiteSpace.find(character) != std::string_view::npos) continue;
        const std::size_t digit = kDigits.find(character);
        if (character == '=') {
            ++padding;
        } else if (digit == std::string_view::npos || padding > 0) {
            return std::nullopt;
        } else {
            ++digits;
            waiting = waiting << 6 | static_cast<std::uint32_t>(digit);
            count += 6;
            if (count < 8) continue;
            count -= 8;
            bytes += static_cast<char>(waiting >> count);
            waiting &= (1U << count) - 1;
        }
    }
    const bool isWhole = (digits + padding) % 4 == 0 && padding <= 2 && waiting == 0;
    return isWhole ? std::optional(std::move(bytes)) : std::nullopt;
}

}  // namespace vexa::client
