#include "client/terminal/TerminalKeys.h"

#include "client/terminal/StandardInput.h"
#include "client/terminal/Terminal.h"

namespace vexa::client {

bool TerminalKeys::isUsable() {
    return isInputTerminal() && isOutputTerminal();
}

bool TerminalKeys::takeQuit() {
    const auto key = take();
    return key && (*key == 'q' || *key == 'Q');
}

}  // namespace vexa::client
