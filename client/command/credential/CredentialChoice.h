#pragma once

#include <optional>
#include <string>

#include "client/hotspot/Credential.h"

namespace CLI {
class App;
}

namespace vexa::client {

/// How the user says which credential is meant: by a word that may be an id or a name, or expressly.
struct CredentialChoice {
    std::optional<std::string> which;
    std::optional<int> id;
    std::optional<std::string> name;

    /// Adds the word and the options. Where `--name` means something else, there is none.
    void addTo(CLI::App& command, bool hasName);

    /// Throws ClientError for wrong use unless it is said in one way.
    void check() const;

    /// As findCredential().
    const Credential& findIn(const CredentialList& list) const;
};

}  // namespace vexa::client
