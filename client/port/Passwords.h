#pragma once

#include <json/value.h>

namespace vexa::client {

/// Whether what is printed tells the passwords of credentials.
enum class Passwords { Hidden, Shown };

/// Stands in the place of one that is hidden.
inline constexpr const char* kHiddenPassword = "********";

/// Hides the passwords that the data of an event tells. Data that speaks of passwords and can't be looked
/// through goes.
void hidePasswords(Json::Value& envelope);

}  // namespace vexa::client
