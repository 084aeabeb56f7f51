#include "hotspot/ShownName.h"

#include "text/Utf8.h"

namespace vexa {

namespace {

constexpr std::string_view kDigits = "0123456789ABCDEF";

bool readsAsByte(std::string_view text) {
    return text.size() >= 4 && text.starts_with("\\x") && kDigits.find(text[2]) != kDigits.npos &&
           kDigits.find(text[3]) != kDigits.npos;
}

}  // namespace

std::string shownName(std::string_view ssid) {
    std::string name;
    while (!ssid.empty()) {
        std::size_t length = firstUtf8Character(ssid).length;
        if (length == 0 || readsAsByte(ssid)) {
            const auto byte = static_cast<unsigned char>(ssid[0]);
            name.append("\\x").append({kDigits[byte >> 4], kDigits[byte & 15]});
            length = 1;
        } else {
            name += ssid.substr(0, length);
        }
        ssid.remove_prefix(length);
    }
    return name;
}

}  // namespace vexa
