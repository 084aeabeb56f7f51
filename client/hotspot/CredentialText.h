#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <vector>

#include "client/hotspot/Credential.h"
#include "client/port/Passwords.h"

namespace vexa::client {

// Credentials in words. Lines have no line end.

/// One row per credential in the order of priority; a heading first. What it is known by, except a password,
/// is shortened where the rows would take more than so many columns.
std::vector<std::string> credentialTable(const CredentialList& list, Passwords passwords,
                                         std::optional<int> columns);

/// One credential, with its position from 1.
Json::Value credentialJson(const Credential& credential, std::size_t position, Passwords passwords);

/// The whole list.
Json::Value credentialsJson(const CredentialList& list, Passwords passwords);

/// Its id and its name.
std::string nameOf(const Credential& credential);

/// What is different between two lists, a sentence each.
std::vector<std::string> credentialChanges(const CredentialList& before, const CredentialList& now);

}  // namespace vexa::client
