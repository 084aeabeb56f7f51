#include "client/machine/StoreFile.h"

#include <fstream>
#include <iterator>

#include "text/XmlText.h"

namespace vexa::client {

bool StoreFile::isWritten() const {
    const auto now = state();
    return now && now != m_seen;
}

std::optional<std::string> StoreFile::objection() const {
    const auto now = state();
    if (!now) return m_path.string() + " cannot be opened";
    if (!xmlText(now->content)) return m_path.string() + " is not well-formed XML";
    return std::nullopt;
}

std::string StoreFile::whyNotWritten() const {
    return objection().value_or(m_path.string() + " could not be written");
}

std::optional<StoreFile::State> StoreFile::state() const {
    std::error_code error;
    const auto time = std::filesystem::last_write_time(m_path, error);
    std::ifstream file(m_path, std::ios::binary);
    if (error || !file) return std::nullopt;
    return State{{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()}, time};
}

}  // namespace vexa::client
