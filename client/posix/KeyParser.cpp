#include "client/posix/KeyParser.h"

#include <array>
#include <utility>

namespace vexa::client {

namespace {

constexpr char kEscape = '\033';

/// What ends a sequence; for `~` the number behind its introduction tells the key.
struct Ending {
    char last;
    char number;
    Key key;
};

// Terminals differ in which of these they send; what was held down beside the key stands behind a `;`.
constexpr std::array kEndings{
    Ending{'A', 0, Key::Up},       Ending{'B', 0, Key::Down},       Ending{'H', 0, Key::Home},
    Ending{'F', 0, Key::End},      Ending{'~', '1', Key::Home},     Ending{'~', '4', Key::End},
    Ending{'~', '5', Key::PageUp}, Ending{'~', '6', Key::PageDown}, Ending{'~', '7', Key::Home},
    Ending{'~', '8', Key::End},
};

bool isIntroduction(char byte) {
    return byte == '[' || byte == 'O';
}

bool isParameter(char byte) {
    return byte >= ' ' && byte <= '?';
}

Key keyOf(const std::string& parameters, char last) {
    const bool isOneDigit = parameters.size() == 1 || (parameters.size() > 1 && parameters[1] == ';');
    for (const Ending& ending : kEndings) {
        if (ending.last != last) continue;
        if (ending.number == 0 || (isOneDigit && parameters.front() == ending.number)) return ending.key;
    }
    return Key::Other;
}

}  // namespace

std::optional<Key> KeyParser::take(char byte) {
    if (byte == kEscape) {
        m_begun = byte;
        return std::nullopt;
    }
    const bool isGoingOn = m_begun.size() == 1 ? isIntroduction(byte) : !m_begun.empty() && isParameter(byte);
    if (isGoingOn) {
        m_begun += byte;
        return std::nullopt;
    }
    const std::string begun = std::exchange(m_begun, "");
    if (begun.size() > 1) return keyOf(begun.substr(2), byte);
    return byte == 'q' || byte == 'Q' ? Key::Quit : Key::Other;
}

}  // namespace vexa::client
