#include "client/machine/StoreFile.h"

#include <fstream>
#include <iterator>

#include "text/XmlText.h"

namespace vexa::client {

namespace {

/// The element that a file lacks of those in which the service keeps credentials; it makes none, and then
/// writes the rest. None, too, of what is no text.
std::string missingPlace(const std::string& content) {
    auto xml = xmlText(content);
    if (!xml) return "";
    const std::size_t begin = xml->find("<users");
    if (begin == std::string::npos) return "users";
    const std::size_t end = xml->find("</users>", begin);
    if (end != std::string::npos) xml->erase(begin, end - begin);  // users have elements of the same name
    return xml->find("<credentials") == std::string::npos ? "credentials" : "";
}

}  // namespace

bool StoreFile::isWritten() const {
    const auto now = state();
    return now && now != m_seen && missingPlace(now->content).empty();
}

std::optional<std::string> StoreFile::objection() const {
    const auto now = state();
    if (!now) return m_path.string() + " cannot be opened";
    if (!xmlText(now->content)) return m_path.string() + " is not well-formed XML";
    return std::nullopt;
}

std::string StoreFile::whyNotWritten() const {
    if (const auto objectionToAll = objection()) return *objectionToAll;
    const auto now = state();
    const std::string missing = now ? missingPlace(now->content) : "";
    return m_path.string() + (missing.empty() ? " could not be written" : " lacks an element " + missing);
}

std::optional<StoreFile::State> StoreFile::state() const {
    std::error_code error;
    const auto time = std::filesystem::last_write_time(m_path, error);
    std::ifstream file(m_path, std::ios::binary);
    if (error || !file) return std::nullopt;
    return State{{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()}, time};
}

}  // namespace vexa::client
