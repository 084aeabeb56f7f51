#pragma once

#include <optional>
#include <string>
#include <vector>

#include "client/hotspot/Credential.h"
#include "client/hotspot/Network.h"

namespace vexa::client {

/// The credentials with which the service tries to join a network, in its order. Only what the network tells
/// of its realms counts.
CredentialList fittingCredentials(const CredentialList& all, const Network& network);

/// The names of those of them with which a connection of this method can have been made. The service does not
/// tell which it was: several of one method stay several. `method` is what the machine has written down: 0 is
/// a connection with none of ours, nothing is not known.
std::vector<std::string> credentialsBehind(const CredentialList& all, const Network& network,
                                           std::optional<int> method);

/// "A", "A or B", "A, B or C"; empty for none.
std::string alternatives(const std::vector<std::string>& names);

/// What stands behind "connected to X": one of the credentials of these names, or none of ours.
std::string withOneOf(const std::vector<std::string>& names);

}  // namespace vexa::client
