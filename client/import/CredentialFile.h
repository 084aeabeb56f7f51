#pragma once

#include <string>

#include "client/import/FiledCredential.h"

namespace vexa::client {

/// The text of a file, cut where it is too long to be read. Throws ClientError.
std::string textOfFile(const std::string& path);

/// Credentials out of such a text: EAP metadata in XML, or our own JSON. Throws ClientError for what is
/// neither, and for more than 1 MiB.
CredentialFile readCredentialFile(const std::string& text);

}  // namespace vexa::client
