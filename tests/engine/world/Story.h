#pragma once

#include <concepts>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include "engine/world/World.h"

namespace vexa::test {

/// A story under way: its world, and what it saw there that differs from what it expected.
class Story : public World {
public:
    Story(const std::string& scenario, const std::filesystem::path& folder, bool withLog)
        : World(scenario, folder, withLog), m_hasLog(withLog) {}

    /// The case that the following looks are about.
    void about(const std::string& theCase) { m_case = theCase + ": "; }

    void expect(std::string_view what, std::string_view got, std::string_view wanted) {
        if (got == wanted) return;
        m_differences += m_case;
        m_differences.append(what).append(" is\n    ").append(got).append("\nwhere it should be\n    ");
        m_differences.append(wanted).append("\n");
    }

    template <std::integral Number>
    void expect(std::string_view what, Number got, std::type_identity_t<Number> wanted) {
        expect(what, std::to_string(got), std::to_string(wanted));
    }

    /// What was read from the log. Not looked at where the log is off; nor is the next.
    template <class Got, class Wanted>
    void expectOfLog(std::string_view what, const Got& got, const Wanted& wanted) {
        if (m_hasLog) expect(what, got, wanted);
    }

    /// These lines stand among the messages of the log in this order, with others between them.
    template <class... Lines>
    void expectLog(const Lines&... lines) {
        expectLines({lines...});
    }
    void expectLines(const std::vector<std::string>& lines) {
        if (!m_hasLog) return;
        const std::string log = "\n" + messages();
        std::size_t at = 0;
        for (const std::string& line : lines) {
            const std::size_t found = log.find("\n" + line + "\n", at);
            if (found == std::string::npos) return expect("the log, in its place", "without the line", line);
            at = found + line.size() + 1;
        }
    }

    const std::string& differences() const { return m_differences; }

    /// What is to be known behind the story's end.
    void tell(const std::string& text) { m_told += text; }
    const std::string& told() const { return m_told; }

private:
    bool m_hasLog;
    std::string m_case;
    std::string m_differences;
    std::string m_told;
};

}  // namespace vexa::test
