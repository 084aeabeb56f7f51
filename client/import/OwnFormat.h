#pragma once

#include <string>

#include "client/import/FiledCredential.h"

namespace vexa::client {

/// Credentials as `vexa credential export` writes them: an object with `format`, `version` 1 and
/// `credentials`, the first one first. Ids and creators are not in it: they belong to the machine.
/// REQUIRES: all are of a type that we know.
std::string ownFormat(const CredentialList& list, Passwords passwords);

/// Reads that again. Throws ClientError that names the member that is wrong.
CredentialFile readOwnFormat(const std::string& text);

}  // namespace vexa::client
