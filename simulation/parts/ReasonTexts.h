#pragma once

#include <string_view>

#include "platform/WlanApi.h"

namespace vexa::simulation {

// Why a connection ended, or didn't come about.
inline constexpr DWORD kSucceeded = 0;
inline constexpr DWORD kUserDisconnected = 0x00028002;
inline constexpr DWORD kConnectionLost = 0x00028003;
inline constexpr DWORD kNotAvailable = 0x00038002;
inline constexpr DWORD kCancelled = 0x00038003;
inline constexpr DWORD kRefused = 0x00050007;

std::u16string_view reasonText(DWORD reason);

}  // namespace vexa::simulation
