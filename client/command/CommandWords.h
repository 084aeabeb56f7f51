#pragma once

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace vexa::client {

/// The words behind the program's name, where `help COMMAND` is `COMMAND --help`. A word that should be a
/// command and is none is named, with those that may have been meant; that is thrown as CLI::ParseError.
std::vector<std::string> commandWords(const CLI::App& app, std::vector<std::string> words);

}  // namespace vexa::client
