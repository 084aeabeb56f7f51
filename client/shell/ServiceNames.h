#pragma once

#include <string>
#include <vector>

namespace vexa::client {

/// The names that a word of the command line can be completed to: `kind` is `networks`, `credentials` or
/// `channels`, `words` what stands on the line, from which the machine and the port are taken. Gives none if
/// no service answers in time; then the process has to end soon, as the question goes on in a thread.
std::vector<std::string> serviceNames(const std::string& kind, const std::vector<std::string>& words);

}  // namespace vexa::client
