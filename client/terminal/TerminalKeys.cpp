#include "client/terminal/TerminalKeys.h"

#include "client/terminal/StandardInput.h"
#include "client/terminal/Terminal.h"

namespace vexa::client {

bool TerminalKeys::isUsable() {
    return isInputTerminal() && isOutputTerminal();
}

bool TerminalKeys::takeQuit() {
    return take() == Key::Quit;
}

}  // namespace vexa::client
