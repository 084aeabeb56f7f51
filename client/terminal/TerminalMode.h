#pragma once

namespace vexa::client {

/// A way in which a command has the terminal to itself. The terminal is as before while the mode has left,
/// and once it has gone.
class TerminalMode {
public:
    TerminalMode() = default;
    virtual ~TerminalMode() = default;
    TerminalMode(const TerminalMode&) = delete;
    TerminalMode& operator=(const TerminalMode&) = delete;

    virtual void enter() = 0;
    virtual void leave() = 0;

    /// The terminal has another size.
    virtual void resized() {}

    /// To be waited for; -1: keys say nothing here.
    virtual int keyDescriptor() const { return -1; }

    /// Takes the key that has come there; true if it asks for the end.
    virtual bool takeQuit() { return false; }
};

}  // namespace vexa::client
