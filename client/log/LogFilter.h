#pragma once

#include <ctime>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "client/machine/LogFiles.h"

namespace CLI {
class App;
}

namespace vexa::client {

/// Which entries of the log the user wants. Each condition that is given has to hold.
struct LogWish {
    /// The lowest level.
    int level = 0;
    std::optional<std::time_t> since;
    std::string text;
    std::string ssid;

    /// Adds the options. To be called on a wish that stays where it is.
    void addTo(CLI::App& command);

    bool isAny() const { return level > 0 || since || !text.empty() || !ssid.empty(); }
};

/// Lets through the lines of those entries. What an entry goes on with belongs to it: a text may begin with
/// an empty line.
class LogFilter {
public:
    using Lines = std::vector<LogFiles::Line>;

    LogFilter(LogWish wish, std::time_t now) : m_wish(std::move(wish)), m_now(now) {}

    /// Those of the lines that are wanted. One that cannot be judged without the next comes with that.
    Lines take(const Lines& lines);

    /// What still waits for a next line, if it is wanted.
    Lines takeRest();

private:
    /// How far a file has been looked through.
    struct Place {
        std::optional<std::time_t> time;
        bool isWanted = false;
        std::optional<LogFiles::Line> held;
    };

    void takeLine(Place& place, const LogFiles::Line& line, Lines& wanted);
    void release(Place& place, const std::string& more, Lines& wanted);
    bool isWanted(const Place& place, const std::string& text) const;

    LogWish m_wish;
    std::time_t m_now;
    std::map<std::string, Place> m_places;
};

}  // namespace vexa::client
