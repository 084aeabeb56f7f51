#include "client/panel/PanelLog.h"

#include <utility>

#include "client/log/LogTime.h"
#include "client/machine/LogSwitch.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr std::size_t kMostLines = 2000;

void keepEnd(std::deque<std::string>& lines) {
    while (lines.size() > kMostLines)
        lines.pop_front();
}

}  // namespace

void PanelLog::follow(const std::optional<MachineFolder>& machine) {
    const std::filesystem::path folder = machine ? machine->dumpFolder() : std::filesystem::path();
    const bool isOn = machine && whyLogIsOff(*machine).empty();
    m_isTold = m_isTold && isOn == m_isOn;
    m_isOn = isOn;
    if (std::exchange(m_folder, folder) == folder) return;
    m_lines.clear();
    m_files.reset();
    if (folder.empty()) return;
    m_files.emplace(folder);
    m_files->skipToLast(kMostLines);
    m_isWithinSecret = true;  // nobody knows
}

std::optional<Json::Value> PanelLog::takeNews() {
    std::deque<std::string> news;
    for (const LogFiles::Line& line : m_files ? m_files->takeLines() : std::vector<LogFiles::Line>()) {
        if (auto text = withoutSecrets(line.text)) news.push_back(std::move(*text));
    }
    if (news.empty() && std::exchange(m_isTold, true)) return std::nullopt;
    keepEnd(news);
    m_lines.insert(m_lines.end(), news.begin(), news.end());
    keepEnd(m_lines);
    return told(news);
}

Json::Value PanelLog::all() const {
    return told(m_lines);
}

Json::Value PanelLog::told(const std::deque<std::string>& lines) const {
    Json::Value texts(Json::arrayValue);
    for (const std::string& line : lines)
        texts.append(line);
    Json::Value object(Json::objectValue);
    object["on"] = m_isOn;
    object["lines"] = std::move(texts);
    return object;
}

// A password may have lines of its own, and then goes on up to the next entry.
std::optional<std::string> PanelLog::withoutSecrets(const std::string& line) {
    const auto head = findEntryHead(line, 0);
    if (m_isWithinSecret && !(head && head->begin == 0)) return std::nullopt;
    std::string shown = withoutPassword(line);
    m_isWithinSecret = shown != line;
    return asUtf8(shown);
}

}  // namespace vexa::client
