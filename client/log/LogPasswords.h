#pragma once

#include <cstddef>
#include <optional>
#include <set>
#include <string>

#include "client/machine/LogFiles.h"

namespace vexa::client {

/// Hides the passwords in the lines of the log. One may have lines of its own, and then goes on up to the
/// next entry.
class LogPasswords {
public:
    /// So many lines before the first that is shown are enough to know whether that belongs to a password.
    static constexpr std::size_t kLinesBefore = 64;

    /// What comes first of this file has something before it that nobody knows.
    void beginWithin(const std::string& file) { m_within.insert(file); }

    /// The line as it may be shown; nothing if all of it may belong to a password.
    std::optional<std::string> shown(const LogFiles::Line& line);

private:
    std::set<std::string> m_within;
};

}  // namespace vexa::client
