#pragma once

#include <windows.h>

#include <cstddef>
#include <span>

namespace vexa::client {

/// Standard input where it is a pipe or a file: nothing can be waited for there, so a thread reads ahead from
/// the first question on.
HANDLE inputEvent();
bool isInputWaiting();

/// 0 bytes at the end; otherwise waits for the first ones.
std::size_t readInput(std::span<char> buffer);

}  // namespace vexa::client
