#include "unit/hotspot/LogCapture.h"

#include <cstdlib>
#include <fstream>
#include <regex>
#include <sstream>

#include "base/DiagnosticLog.h"

namespace vexa::test {

namespace fs = std::filesystem;

LogCapture::LogCapture() {
    std::string pattern = (fs::temp_directory_path() / "vexa-log-XXXXXX").string();
    m_folder = mkdtemp(pattern.data());
    DiagnosticLog::instance().setEnableDump(true);
    DiagnosticLog::instance().start((m_folder / "log").string());
}

LogCapture::~LogCapture() {
    DiagnosticLog::instance().setEnableDump(false);
    DiagnosticLog::instance().flushToFile();
    DiagnosticLog::instance().stop();
    fs::remove_all(m_folder);
}

// Bytes in hex come without a line feed, so it is the next number that tells where a message ends.
std::vector<std::string> LogCapture::lines() {
    DiagnosticLog::instance().flushToFile();
    std::ostringstream content;
    content << std::ifstream(m_folder / "log", std::ios::binary).rdbuf();
    fs::remove(m_folder / "log");
    static const std::regex kNumber(R"(\n?\[\d+\] (\d\d/\d\d \d\d:\d\d:\d\d  )?)");
    std::istringstream marked(std::regex_replace(content.str() + "[0] ", kNumber, std::string(1, '\0')));
    std::vector<std::string> lines;
    for (std::string line; std::getline(marked, line, '\0');)
        lines.push_back(line);
    if (!lines.empty()) lines.erase(lines.begin());
    return lines;
}

std::string LogCapture::text() {
    std::string text;
    for (const std::string& line : lines())
        text += line + "\n";
    return text;
}

}  // namespace vexa::test
