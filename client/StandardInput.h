#pragma once

#include <cstddef>
#include <span>

namespace vexa::client {

/// A person types what comes on standard input.
bool isInputTerminal();

/// What has come on standard input, after waitFor() has told of it; 0 bytes at its end.
std::size_t readStandardInput(std::span<char> buffer);

}  // namespace vexa::client
