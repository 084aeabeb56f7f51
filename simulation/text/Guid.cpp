#include "simulation/text/Guid.h"

#include <cstring>
#include <string>

#include "simulation/text/Text.h"

namespace vexa::simulation {

namespace {

constexpr std::string_view kForm = "{xxxxxxxx-xxxx-xxxx-xxxx-xxxxxxxxxxxx}";

std::optional<std::string> digitsOf(std::string_view text) {
    if (text.size() != kForm.size()) return std::nullopt;
    std::string digits;
    for (std::size_t i = 0; i < kForm.size(); ++i) {
        if (kForm[i] == 'x') {
            digits.push_back(text[i]);
        } else if (text[i] != kForm[i]) {
            return std::nullopt;
        }
    }
    return digits;
}

}  // namespace

std::optional<GUID> guidFromText(std::string_view text) {
    const auto digits = digitsOf(text);
    const auto bytes = digits ? bytesFromHex(*digits) : std::nullopt;
    if (!bytes) return std::nullopt;
    const Bytes& b = *bytes;
    GUID guid{};
    guid.Data1 = std::uint32_t{b[0]} << 24 | std::uint32_t{b[1]} << 16 | std::uint32_t{b[2]} << 8 | b[3];
    guid.Data2 = static_cast<std::uint16_t>(b[4] << 8 | b[5]);
    guid.Data3 = static_cast<std::uint16_t>(b[6] << 8 | b[7]);
    std::memcpy(guid.Data4, &b[8], sizeof guid.Data4);
    return guid;
}

}  // namespace vexa::simulation
