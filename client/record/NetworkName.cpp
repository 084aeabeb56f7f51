#include "client/record/NetworkName.h"

#include "text/Utf8.h"

namespace vexa::client {

namespace {

constexpr std::size_t kEscapeLength = 4;

/// The value of a digit as the service writes it; 16 for what is none.
std::size_t digit(char character) {
    constexpr std::string_view kDigits = "0123456789ABCDEF";
    const std::size_t value = kDigits.find(character);
    return value == std::string_view::npos ? kDigits.size() : value;
}

bool beginsWithEscape(std::string_view text) {
    return text.size() >= kEscapeLength && text.starts_with("\\x") && digit(text[2]) < 16 &&
           digit(text[3]) < 16;
}

}  // namespace

std::string ssidOfName(std::string_view name) {
    std::string ssid;
    while (!name.empty()) {
        const bool isEscape = beginsWithEscape(name);
        ssid += isEscape ? static_cast<char>(digit(name[2]) * 16 + digit(name[3])) : name[0];
        name.remove_prefix(isEscape ? kEscapeLength : 1);
    }
    return ssid.empty() ? std::string(1, '\0') : ssid;
}

bool isTextSsid(std::string_view ssid) {
    return isValidUtf8(ssid) && ssid.find('\0') == std::string_view::npos;
}

std::string hexOf(std::string_view bytes) {
    constexpr const char* kDigits = "0123456789abcdef";
    std::string hex;
    for (const char character : bytes) {
        const auto byte = static_cast<unsigned char>(character);
        hex += {kDigits[byte >> 4U], kDigits[byte & 15U]};
    }
    return hex;
}

}  // namespace vexa::client
