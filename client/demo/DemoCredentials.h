#pragma once

#include "client/hotspot/Credential.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

/// Stores what a traveller may have in his pocket, and gives the list of the service then. Throws
/// ClientError.
CredentialList storeDemoCredentials(HotspotPort& port);

}  // namespace vexa::client
