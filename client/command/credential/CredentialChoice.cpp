#include "client/command/credential/CredentialChoice.h"

#include <CLI/CLI.hpp>

#include "client/terminal/ClientError.h"

namespace vexa::client {

void CredentialChoice::addTo(CLI::App& command, bool hasName) {
    command.add_option("WHICH", which, "Its id, or its name")->type_name("TEXT");
    command.add_option("--id", id, "Its id, where a name could be meant")->type_name("N");
    if (hasName)
        command.add_option("--name", name, "Its name, where an id could be meant")->type_name("TEXT");
}

void CredentialChoice::check() const {
    const int ways = (which ? 1 : 0) + (id ? 1 : 0) + (name ? 1 : 0);
    if (ways == 0) throw ClientError("WHICH is required: the id or the name of a credential", kExitWrongUse);
    if (ways > 1) throw ClientError("the credential is to be named in one way alone", kExitWrongUse);
}

const Credential& CredentialChoice::findIn(const CredentialList& list) const {
    if (which) return findCredential(list, *which);
    if (name) return findNamed(list, *name);
    if (const Credential* const credential = findById(list, *id)) return *credential;
    throw ClientError("there is no credential " + std::to_string(*id));
}

}  // namespace vexa::client
