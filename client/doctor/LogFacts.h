#pragma once

#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace vexa::client {

/// What only the diagnostic log knows of how a connection is chosen. Names of networks are UTF-8.
struct LogFacts {
    struct Attempt {
        std::string network;
        bool isSuccess;
        /// As the system words it; empty if it was not told.
        std::string reason;
    };

    /// As the last round saw it that looked.
    std::optional<bool> isSessionActive;
    /// A round came as far as choosing; what follows is of the last one that did.
    bool hasChosen = false;
    /// Id and network of the credentials without attempts left.
    std::set<std::pair<int, std::string>> exhausted;
    /// Networks that the user has left.
    std::set<std::string> blocked;

    std::optional<Attempt> lastAttempt;
};

/// Out of lines of the log, the oldest first. A run that began among them counts from there.
LogFacts logFacts(const std::vector<std::string>& lines);

}  // namespace vexa::client
