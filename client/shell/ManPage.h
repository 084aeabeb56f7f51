#pragma once

#include <string>

#include "client/shell/CommandText.h"

namespace vexa::client {

/// The page's name, such as `vexa-credential-add`.
std::string manPageName(const CommandText& command);

/// The manual page of the program or of a command of it, for troff with its man macros, with the texts that
/// `--help` shows.
std::string manPage(const CommandText& program, const CommandText& command);

}  // namespace vexa::client
