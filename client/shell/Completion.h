#pragma once

#include <string>

#include "client/shell/CommandText.h"

namespace vexa::client {

// The scripts that make a shell complete the program's command line, made from the commands as the parser
// knows them. Names that only the service knows are asked for while the user waits, by the hidden command
// `__complete`.

std::string bashCompletion(const CommandText& program);
std::string zshCompletion(const CommandText& program);
std::string fishCompletion(const CommandText& program);
std::string powerShellCompletion(const CommandText& program);

/// The kind of names that `__complete` is asked for; empty if the service does not know them.
std::string askedNames(ValueKind kind);

/// The text with each of these characters behind a backslash, or behind what is given in its place.
std::string escapedText(const std::string& text, const std::string& special, const std::string& with = "\\");

/// The words with something between two of them.
std::string joined(const std::vector<std::string>& words, const std::string& between);

}  // namespace vexa::client
