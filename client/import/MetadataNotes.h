#pragma once

#include <pugixml.hpp>

#include <set>
#include <string>
#include <vector>

namespace vexa::client {

/// What of a provider's element goes into credentials, and what is left over.
class MetadataNotes {
public:
    explicit MetadataNotes(std::string provider) : m_provider(std::move(provider)) {}

    /// The element, with all that it holds, needs no word.
    void take(pugi::xml_node node) { m_taken.insert(node); }

    /// One line: what it is, in words, and why it is not kept. Said twice, it is told once.
    void tell(const std::string& what, const std::string& reason);

    /// A line for each element below this one that was not taken and says something.
    void tellRest(pugi::xml_node parent);

    const std::vector<std::string>& lines() const { return m_lines; }

private:
    void tellElement(pugi::xml_node node);

    std::string m_provider;
    std::set<pugi::xml_node> m_taken;
    std::vector<std::string> m_lines;
    std::set<std::string> m_told;
};

}  // namespace vexa::client
