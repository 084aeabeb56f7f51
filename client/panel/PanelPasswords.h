#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>

#include "client/port/Event.h"

namespace vexa::client {

/// The stored passwords, as the service told them last. They don't go to a page; one that edits a credential
/// and leaves its password alone sends the mask, and gets the password put in on the way to the service.
class PanelPasswords {
public:
    /// Takes in an event of the hotspot port.
    void take(const Event& event);

    /// The service is another one now.
    void forget() { m_passwords.clear(); }

    /// The data of an edit as the service is to get it. Nothing if it keeps a password that isn't known.
    std::optional<std::string> filledIn(const std::string& data) const;

private:
    std::map<std::int64_t, std::string> m_passwords;
};

}  // namespace vexa::client
