#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "client/hotspot/Credential.h"
#include "client/hotspot/CredentialText.h"

namespace vexa::client {

/// A credential out of a file. A user name or a password that the file does not tell is empty, and so is the
/// client certificate of one that only holds the certificate itself.
struct FiledCredential {
    Credential credential;
    /// Which provider of the file it is for: those of one have the same user.
    std::size_t provider = 0;
    /// What a user name without a realm gets behind it.
    std::string userSuffix;
};

struct CredentialFile {
    /// The one to be preferred first.
    std::vector<FiledCredential> credentials;
    /// What of the file a credential of the service cannot hold, a line each.
    std::vector<std::string> notes;
};

}  // namespace vexa::client
