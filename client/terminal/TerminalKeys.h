#pragma once

#include <memory>
#include <optional>

#include "client/terminal/TerminalMode.h"

namespace vexa::client {

/// What a user can want of a picture by pressing a key.
enum class Key { Quit, Up, Down, PageUp, PageDown, Home, End, Other };

/// Keys of the terminal, each at once and without echo. Where standard input is no terminal there are no
/// keys.
class TerminalKeys final : public TerminalMode {
public:
    TerminalKeys();
    ~TerminalKeys() override;

    /// A person sits at both ends: he types, and reads what is printed.
    static bool isUsable();

    void enter() override;
    void leave() override;
    int keyDescriptor() const override;
    bool takeQuit() override;

    /// The key that has come; nothing if none has, or only a part of one.
    std::optional<Key> take();

private:
    struct State;
    std::unique_ptr<State> m_state;
};

}  // namespace vexa::client
