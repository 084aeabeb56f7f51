#include "client/log/LogFilter.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <string_view>

#include "client/log/LogLevels.h"
#include "client/log/LogTime.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

// The texts put a network's name between one of these and one of those, or end with it.
constexpr std::array<std::string_view, 3> kBeforeName{"ssid=", "network=", "####"};
constexpr std::array<std::string_view, 11> kBehindName{"\n",         "\t",       "#",           ", ",
                                                       " and ",      " while ",  " since ",     " is no ",
                                                       " has been ", " due to ", " using next "};

bool standsBetween(std::string_view before, std::string_view behind) {
    const auto endsIt = [&](std::string_view mark) { return before.ends_with(mark); };
    const auto beginsIt = [&](std::string_view mark) { return behind.starts_with(mark); };
    return std::any_of(kBeforeName.begin(), kBeforeName.end(), endsIt) &&
           (behind.empty() || std::any_of(kBehindName.begin(), kBehindName.end(), beginsIt));
}

bool isNamed(std::string_view text, std::string_view ssid) {
    for (std::size_t at = text.find(ssid); at != text.npos; at = text.find(ssid, at + 1)) {
        if (standsBetween(text.substr(0, at), text.substr(at + ssid.size()))) return true;
    }
    return false;
}

/// Of an entry in hex the number, of another the line end that sets it off.
std::string_view withoutBeginning(std::string_view text) {
    const std::size_t close = text.find("] ");
    if (text.starts_with('[') && close != text.npos &&
        text.substr(1, close - 1).find_first_not_of("0123456789") == text.npos)
        text.remove_prefix(close + 2);
    while (text.starts_with('\n'))
        text.remove_prefix(1);
    return text;
}

/// The highest in the text, as entries in hex stand before others in a line.
int levelOf(std::string_view text) {
    int level = 0;
    std::size_t begin = 0;
    for (auto head = findEntryHead(text, 0); head; head = findEntryHead(text, begin)) {
        if (head->begin > begin)
            level = std::max(level, levelOfText(withoutBeginning(text.substr(begin, head->begin - begin))));
        begin = head->end;
    }
    return std::max(level, levelOfText(withoutBeginning(text.substr(begin))));
}

std::optional<EntryHead> lastHead(std::string_view text) {
    std::optional<EntryHead> last;
    for (auto head = findEntryHead(text, 0); head; head = findEntryHead(text, head->end))
        last = head;
    return last;
}

}  // namespace

void LogWish::addTo(CLI::App& command) {
    command
        .add_option("--level", level,
                    "What is of this level or above: 2 detail, 3 trace, 4 milestones, 6 errors")
        ->type_name("N")
        ->check(CLI::Range(0, kHighestLevel));
    const auto takeMoment = [this](const std::string& given) {
        since = parseMoment(given, std::time(nullptr));
        if (!since)
            throw CLI::ValidationError("--since",
                                       given + " is no time such as 10m, 2h, HH:MM or YYYY-MM-DD HH:MM");
    };
    command
        .add_option_function<std::string>("--since", takeMoment,
                                          "What is no older: 10m, 2h, HH:MM or YYYY-MM-DD HH:MM")
        ->type_name("TIME");
    command.add_option("--grep", text, "What holds this text")->type_name("TEXT");
    command.add_option("--ssid", ssid, "What names this network")->type_name("NAME");
}

LogFilter::Lines LogFilter::take(const Lines& lines) {
    if (!m_wish.isAny()) return lines;
    Lines wanted;
    for (const LogFiles::Line& line : lines)
        takeLine(m_places[line.file], line, wanted);
    return wanted;
}

LogFilter::Lines LogFilter::takeRest() {
    Lines wanted;
    for (auto& [file, place] : m_places)
        release(place, "", wanted);
    return wanted;
}

void LogFilter::takeLine(Place& place, const LogFiles::Line& line, Lines& wanted) {
    const std::string text = asUtf8(line.text);
    const auto head = lastHead(text);
    release(place, head ? "" : text, wanted);
    if (head) {
        if (m_wish.since) place.time = timeOf(*head, m_now);
        if (head->end == text.size()) {
            place.held = line;
            return;
        }
        place.isWanted = isWanted(place, text);
    }
    if (place.isWanted) wanted.push_back(line);
}

/// Judges the line that was held by what has come behind it.
void LogFilter::release(Place& place, const std::string& more, Lines& wanted) {
    if (!place.held) return;
    place.isWanted = isWanted(place, asUtf8(place.held->text) + "\n" + more);
    if (place.isWanted) wanted.push_back(*place.held);
    place.held.reset();
}

bool LogFilter::isWanted(const Place& place, const std::string& text) const {
    if (m_wish.since && (!place.time || *place.time < *m_wish.since)) return false;
    if (m_wish.level > 0 && levelOf(text) < m_wish.level) return false;
    if (text.find(m_wish.text) == std::string::npos) return false;
    return m_wish.ssid.empty() || isNamed(text, m_wish.ssid);
}

}  // namespace vexa::client
