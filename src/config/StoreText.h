#pragma once

#include <string>
#include <vector>

#include "config/Credential.h"

namespace vexa {

// Elements of config.xml as a save writes them.

/// Whether XML can hold all that is written of the credential.
bool canBeWritten(const Credential& credential);

/// `creator`: who saves, for he signs what all see.
void appendCredentialText(std::string& text, const Credential& credential, const std::wstring& creator);

/// The user's own list: which credentials he sees, in which places.
void appendUserText(std::string& text, const std::wstring& userName,
                    const std::vector<const Credential*>& credentials);

}  // namespace vexa
