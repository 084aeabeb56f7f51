#pragma once

#include <memory>
#include <optional>

namespace vexa::client {

/// Keys of the terminal, each at once and without echo. The terminal is as before once the object has gone,
/// or while it has left. Where standard input is no terminal there are no keys.
class TerminalKeys {
public:
    TerminalKeys();
    ~TerminalKeys();
    TerminalKeys(const TerminalKeys&) = delete;
    TerminalKeys& operator=(const TerminalKeys&) = delete;

    /// A person sits at both ends: he types, and reads what is printed.
    static bool isUsable();

    void enter();
    void leave();

    /// To be waited for; -1 if there are no keys.
    int descriptor() const;

    /// A key that was pressed, or nothing. To be called when the descriptor is readable.
    std::optional<char> take();

    /// Takes a key; true if it asks for the end.
    bool takeQuit();

private:
    struct State;
    std::unique_ptr<State> m_state;
};

}  // namespace vexa::client
