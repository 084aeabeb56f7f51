#include "client/shell/Completion.h"

namespace vexa::client {

std::string askedNames(ValueKind kind) {
    if (kind == ValueKind::Network) return "networks";
    if (kind == ValueKind::Credential) return "credentials";
    if (kind == ValueKind::Channel) return "channels";
    return "";
}

std::string escapedText(const std::string& text, const std::string& special, const std::string& with) {
    std::string escaped;
    for (const char character : text) {
        if (special.find(character) != std::string::npos) escaped += with;
        escaped += character;
    }
    return escaped;
}

std::string joined(const std::vector<std::string>& words, const std::string& between) {
    std::string text;
    for (const std::string& word : words)
        text += (text.empty() ? "" : between) + word;
    return text;
}

}  // namespace vexa::client
