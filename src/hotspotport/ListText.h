#pragma once

#include <concepts>
#include <string>
#include <string_view>
#include <utility>

#include "channel/StyledText.h"

namespace vexa {

// The lists are long and follow every change, so they are written straight into their event, as they stand
// there: in the styled form, within a string of JSON.

/// One element of a list.
class ObjectText {
public:
    explicit ObjectText(std::string& event) : m_event(event) {}

    template <std::integral Number>
    void member(const char* name, Number number) {
        begin(name).append(std::to_string(number));
    }
    void member(const char* name, bool flag) { begin(name).append(flag ? "true" : "false"); }
    void member(const char* name, std::string_view utf8) { appendQuotedTwice(begin(name), utf8); }

    /// Of a member whose value the caller appends.
    std::string& begin(const char* name) {
        m_event.append(std::exchange(m_before, R"(,\n      \")")).append(name).append(R"(\" : )");
        return m_event;
    }
    void end() { m_event += R"(\n   })"; }

private:
    std::string& m_event;
    const char* m_before = R"(   {\n      \")";
};

/// The text of a list, `null` if it is empty; `append` appends one element.
template <class Elements, class Append>
void appendListText(std::string& event, const Elements& elements, Append append) {
    const char* before = R"("[\n)";
    for (const auto* element : elements) {
        event += std::exchange(before, R"(,\n)");
        append(*element);
    }
    event += elements.empty() ? R"("null\n")" : R"(\n]\n")";
}

}  // namespace vexa
