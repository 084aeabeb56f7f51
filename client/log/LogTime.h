#pragma once

#include <ctime>
#include <optional>
#include <string>
#include <string_view>

namespace vexa::client {

/// What stands at the beginning of an entry of the log.
struct EntryHead {
    /// Where the head begins, and where the text behind it.
    std::size_t begin = 0;
    std::size_t end = 0;
    /// Of the local time, but for the year, which the log does not tell.
    std::tm time{};
};

/// The first head in the text from there on, as in `[1043] 05/17 06:32:17  `; an entry in hex has none.
std::optional<EntryHead> findEntryHead(std::string_view text, std::size_t from);

/// When it was: the last such day of a year, for which tomorrow counts too, as clocks may differ.
std::time_t timeOf(const EntryHead& head, std::time_t now);

/// The moment that a user means: `10m`, `2h`, also in `s` and `d`, ago; `HH:MM`, when the clock showed it
/// last; `YYYY-MM-DD HH:MM`. Nothing if it is none of these.
std::optional<std::time_t> parseMoment(const std::string& text, std::time_t now);

}  // namespace vexa::client
