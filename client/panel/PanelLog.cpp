#include "client/panel/PanelLog.h"

#include <utility>

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
    m_passwords = LogPasswords();
    m_passwords.beginWithin(m_files->skipToLast(kMostLines + LogPasswords::kLinesBefore));
}

std::optional<Json::Value> PanelLog::takeNews() {
    std::deque<std::string> news;
    for (const LogFiles::Line& line : m_files ? m_files->takeLines() : std::vector<LogFiles::Line>()) {
        if (const auto text = m_passwords.shown(line)) news.push_back(asUtf8(*text));
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

}  // namespace vexa::client
