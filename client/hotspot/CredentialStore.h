#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <string>

#include "client/hotspot/Credential.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

/// The credentials of a service, read and changed through its port. A change returns when a list has shown
/// it; one that the service refused ends in a ClientError that says why.
class CredentialStore {
public:
    explicit CredentialStore(HotspotPort& port) : m_port(port) {}

    /// Asks for the list. Throws ClientError, also if the service has no adapter: it tells nothing then.
    const CredentialList& read();

    /// Makes the service read its file again, then asks for the list.
    const CredentialList& reload();

    /// As the last list had it.
    const CredentialList& list() const { return m_list; }

    // REQUIRES: the list has been read.

    /// Gives what was stored, with its id.
    const Credential& add(const Credential& wanted);

    /// The credential with this id becomes like this.
    void edit(const Credential& wanted);

    void erase(int id);

    /// Position from 1; one behind the end means the end. Gives the position that it has now.
    std::size_t move(int id, std::size_t position);

private:
    using Shows = std::function<bool(const CredentialList& list)>;

    bool change(const std::string& command, const std::string& data, const Shows& shows);

    HotspotPort& m_port;
    CredentialList m_list;
};

}  // namespace vexa::client
