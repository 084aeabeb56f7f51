#pragma once

#include <string>

#include "client/import/FiledCredential.h"

namespace vexa::client {

/// Credentials out of EAP metadata, the XML in which providers hand out how to get into their networks
/// (`.eap-config`). Each method of a provider that the service has gives one for each of his realms. Throws
/// ClientError for what is no such file, also for XML that one need not bear.
CredentialFile readEapMetadata(const std::string& text);

}  // namespace vexa::client
