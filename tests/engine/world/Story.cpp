#include "engine/world/Story.h"

namespace vexa::test {

Story::Story(const std::string& scenario, const std::filesystem::path& folder, bool withLog)
    : World(scenario, folder, withLog), m_hasLog(withLog) {}

void Story::expect(std::string_view what, std::string_view got, std::string_view wanted) {
    if (got == wanted) return;
    for (const std::string_view part : {std::string_view(m_case), what, std::string_view(" is\n    "), got,
                                        std::string_view("\nwhere it should be\n    "), wanted})
        m_differences += part;
    m_differences += "\n";
}

void Story::expectLog(const std::vector<std::string>& lines) {
    if (!m_hasLog) return;
    const std::string log = "\n" + messages();
    std::size_t at = 0;
    for (const std::string& line : lines) {
        const std::size_t found = log.find("\n" + line + "\n", at);
        if (found == std::string::npos) {
            m_differences += m_case + "not in the log, or not in its place: " + line + "\n";
            return;
        }
        at = found + line.size() + 1;
    }
}

}  // namespace vexa::test
