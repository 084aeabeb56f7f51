#include "client/terminal/PasswordPrompt.h"

#include <iostream>
#include <optional>

#include "client/terminal/ClientError.h"
#include "client/terminal/StandardInput.h"

namespace vexa::client {

namespace {

std::string required(const std::optional<std::string>& line) {
    if (!line || line->empty()) throw ClientError("no password was given");
    return *line;
}

std::string askOnce(Signals& signals, const std::string& prompt) {
    try {
        const auto line = readHiddenLine(signals, prompt);
        std::cerr << '\n';
        return required(line);
    } catch (const StoppedByUser&) {
        std::cerr << '\n';
        throw;
    }
}

}  // namespace

std::string readPassword(Signals& signals) {
    return required(readHiddenLine(signals, ""));
}

std::string askPassword(Signals& signals) {
    if (!isInputTerminal())
        throw ClientError("there is no terminal to ask for the password: give it with --password-stdin",
                          kExitWrongUse);
    std::string password = askOnce(signals, "Password: ");
    if (askOnce(signals, "Again: ") != password) throw ClientError("the two passwords differ");
    return password;
}

}  // namespace vexa::client
