#include "client/doctor/LogFacts.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <string_view>

#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

/// A text of the log begins with it; `take` gets what stands behind.
struct Row {
    std::string_view beginning;
    void (*take)(LogFacts& facts, std::string_view rest);
};

void takeExhausted(LogFacts& facts, std::string_view rest) {
    static constexpr std::string_view kSsid = ", ssid=";
    int id = 0;
    const auto [end, error] = std::from_chars(rest.data(), rest.data() + rest.size(), id);
    rest.remove_prefix(static_cast<std::size_t>(end - rest.data()));
    if (error == std::errc() && rest.starts_with(kSsid))
        facts.exhausted.emplace(id, asUtf8(rest.substr(kSsid.size())));
}

void takeReason(LogFacts& facts, std::string_view rest) {
    if (facts.lastAttempt && facts.lastAttempt->reason.empty()) facts.lastAttempt->reason = asUtf8(rest);
}

constexpr std::array kRows{
    Row{"SupplicantMgr initiailization succeeded.",
        [](LogFacts& facts, std::string_view) { facts = LogFacts(); }},
    Row{"Current session is not active, sleep for a while and continue.",
        [](LogFacts& facts, std::string_view) { facts.isSessionActive = false; }},
    Row{">>>> Enter connectNetwork", [](LogFacts& facts, std::string_view) { facts.isSessionActive = true; }},
    Row{"Enter findBestMatchBssAndCredential...",
        [](LogFacts& facts, std::string_view) {
            facts.hasChosen = true;
            facts.exhausted.clear();
            facts.blocked.clear();
        }},
    Row{"This network has been disconnected by user, skip auto connecting to ssid=",
        [](LogFacts& facts, std::string_view rest) { facts.blocked.insert(asUtf8(rest)); }},
    Row{"Retry number exceeds maximum retry limit, skip this credential id=", &takeExhausted},
    Row{"Connection succeeded! profile name=",
        [](LogFacts& facts, std::string_view rest) {
            facts.lastAttempt = {asUtf8(rest), true, ""};
        }},
    Row{"Connection failed! profile name=",
        [](LogFacts& facts, std::string_view rest) {
            facts.lastAttempt = {asUtf8(rest), false, ""};
        }},
    Row{"Reason code desc=", &takeReason},
};

/// Behind number and time, which a line has that begins an entry.
std::string_view textOfLine(std::string_view line) {
    static constexpr std::string_view kForm = "00/00 00:00:00  ";
    const std::size_t time = line.find("] ");
    if (line.starts_with('[') && time != std::string_view::npos && line.size() >= time + 2 + kForm.size())
        line.remove_prefix(time + 2 + kForm.size());
    return line.substr(std::min(line.find_first_not_of('\t'), line.size()));
}

}  // namespace

LogFacts logFacts(const std::vector<std::string>& lines) {
    LogFacts facts;
    for (const std::string& line : lines) {
        const std::string_view text = textOfLine(line);
        for (const Row& row : kRows) {
            if (text.starts_with(row.beginning)) row.take(facts, text.substr(row.beginning.size()));
        }
    }
    return facts;
}

}  // namespace vexa::client
