#pragma once

#include <json/value.h>

#include <cstdint>
#include <optional>

#include "config/Credential.h"

namespace vexa {

// What a command's `Data` holds. Missing members and null read as 0, false and empty text; a member of a
// wrong type, or a number that is no 32-bit integer, makes the whole command one that can't be carried out.

/// A credential as the client describes it. Nothing also if a text holds characters that the file can't.
std::optional<CredentialInput> readCredentialInput(const Json::Value& data);

/// One integer member.
std::optional<std::int32_t> readInteger(const Json::Value& data, const char* member);

}  // namespace vexa
