#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace vexa {

/// The content of a file, taken piece by piece. As far as it is what is known already nothing of it is
/// copied: mostly it is, and it can be large.
class StoredContent {
public:
    /// The known content must outlive this, or its last use.
    explicit StoredContent(std::string_view known) : m_known(known) {}

    /// Of a file that is known to be as it was.
    static StoredContent unchanged(std::string_view known) {
        StoredContent content(known);
        content.m_length = known.size();
        return content;
    }

    void take(std::string_view piece) {
        if (m_isKnown && m_known.substr(m_length).starts_with(piece)) {
            m_length += piece.size();
            return;
        }
        if (m_isKnown) m_text = m_known.substr(0, m_length);
        m_isKnown = false;
        m_text += piece;
    }

    /// Whether all of it is what is known, and nothing is missing.
    bool isKnown() const { return m_isKnown && m_length == m_known.size(); }
    std::string text() const { return m_isKnown ? std::string(m_known.substr(0, m_length)) : m_text; }

private:
    std::string_view m_known;
    std::size_t m_length = 0;  // of the known that has been taken
    bool m_isKnown = true;     // so far
    std::string m_text;
};

}  // namespace vexa
