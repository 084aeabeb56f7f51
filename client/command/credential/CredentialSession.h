#pragma once

#include <optional>

#include "client/command/HotspotOptions.h"
#include "client/hotspot/ChangeTurn.h"
#include "client/hotspot/CredentialStore.h"
#include "client/hotspot/CredentialText.h"
#include "client/port/HotspotPort.h"
#include "client/terminal/Signals.h"

namespace vexa::client {

/// A command that changes credentials: it knows from the start that there is a service, and from begin() on
/// it is the only one that talks to it of changes.
class CredentialSession {
public:
    explicit CredentialSession(const HotspotOptions& options);

    Signals& signals() { return m_signals; }

    /// Waits for our turn and reads the list.
    CredentialStore& begin();

    /// Says what was done: a sentence, or an object with `verb` and the credential. Throws ClientError if the
    /// service could not save it.
    void report(const std::string& verb, const std::string& sentence, const Credential& credential,
                std::size_t position) const;

private:
    void connect();

    HotspotOptions m_options;
    std::uint16_t m_number;
    Signals m_signals;
    std::optional<ChangeTurn> m_turn;
    std::optional<HotspotPort> m_port;
    std::optional<CredentialStore> m_store;
};

}  // namespace vexa::client
