#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <string>

#include "client/hotspot/Credential.h"
#include "client/machine/StoreFile.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

/// The credentials of a service, read and changed through its port. A change returns when a list has shown
/// it; one that the service refused ends in a ClientError that says why.
class CredentialStore {
public:
    /// `machine`: the one whose service it is, if that is known.
    explicit CredentialStore(HotspotPort& port, const std::optional<MachineFolder>& machine = std::nullopt);

    /// Asks for the list. Throws ClientError, also if the service has no adapter: it tells nothing then.
    const CredentialList& read();

    /// Makes the service read its file again, then asks for the list. Throws ClientError if the file of a
    /// known machine is such that it can't have been read.
    const CredentialList& reload();

    /// As the last list had it.
    const CredentialList& list() const { return m_list; }

    /// Why the service has the last change in its memory alone; nothing if it is in the file, or if the
    /// machine is not known.
    const std::optional<std::string>& whyUnsaved() const { return m_whyUnsaved; }

    // REQUIRES: the list has been read.

    /// Gives what was stored, with its id.
    const Credential& add(const Credential& wanted);

    /// The credential with this id becomes like this. Throws ClientError if it would clash with another.
    void edit(const Credential& wanted);

    void erase(int id);

    /// Position from 1; one behind the end means the end. Gives the position that it has now.
    std::size_t move(int id, std::size_t position);

private:
    using Shows = std::function<bool(const CredentialList& list)>;

    bool change(const std::string& command, const std::string& data, const Shows& shows);

    HotspotPort& m_port;
    std::optional<StoreFile> m_file;
    std::optional<std::string> m_whyUnsaved;
    CredentialList m_list;
};

}  // namespace vexa::client
