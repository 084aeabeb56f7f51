#pragma once

#include <optional>
#include <string>

#include "client/hotspot/Credential.h"
#include "client/terminal/Signals.h"

namespace CLI {
class App;
}

namespace vexa::client {

/// The parts of a credential that a command was given. Those that were not stay as they are.
struct CredentialFields {
    std::optional<std::string> name;
    std::optional<std::string> realm;
    std::optional<std::string> username;
    std::optional<std::string> caCert;
    std::optional<std::string> clientCert;
    std::optional<bool> autoConnect;
    bool passwordFromInput = false;

    /// The options for them.
    void addTo(CLI::App& command);

    bool isEmpty() const;

    void applyTo(Credential& credential) const;

    /// What does not go together with the credential's method, or is needed for it and missing after
    /// applyTo(); its password is not looked at. Throws ClientError for wrong use.
    void checkAgainst(const Credential& credential) const;
};

/// Throws ClientError for wrong use if the service could not store the text.
void checkText(const Credential& credential);

}  // namespace vexa::client
