#include "client/log/LogPasswords.h"

#include <string_view>

#include "client/log/LogTime.h"
#include "client/port/Passwords.h"

namespace vexa::client {

namespace {

bool beginsEntry(const std::string& line) {
    const auto head = findEntryHead(line, 0);
    return head && head->begin == 0;
}

}  // namespace

// The password stands last in its entry, and may hold anything.
std::optional<std::string> LogPasswords::shown(const LogFiles::Line& line) {
    constexpr std::string_view kBefore = ", password=";
    if (m_within.contains(line.file)) {
        if (!beginsEntry(line.text)) return std::nullopt;
        m_within.erase(line.file);
    }
    const std::size_t found = line.text.find(kBefore);
    if (found == std::string::npos) return line.text;
    m_within.insert(line.file);
    return line.text.substr(0, found + kBefore.size()) + kHiddenPassword;
}

}  // namespace vexa::client
