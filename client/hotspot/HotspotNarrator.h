#pragma once

#include <functional>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "client/hotspot/Credential.h"
#include "client/hotspot/Network.h"
#include "client/port/Event.h"

namespace vexa::client {

/// Makes sentences of what the hotspot port tells. It remembers how things stand, so that a list becomes what
/// is new in it, and what is told twice is said once. Pure: fed with events.
class HotspotNarrator {
public:
    /// Looks up the method of the connection that there is now, as credentialsBehind() takes it.
    using Method = std::function<std::optional<int>()>;

    explicit HotspotNarrator(Method method) : m_method(std::move(method)) {}

    /// The commands whose answers say how things stand, for the beginning.
    static std::vector<const char*> firstQuestions();

    /// What the event brings that was not known, a sentence each.
    std::vector<std::string> tell(const Event& event);

    /// The commands that would tell more about what was heard.
    std::vector<const char*> takeQuestions();

    const NetworkList& networks() const { return m_networks; }
    const CredentialList& credentials() const { return m_credentials; }

    /// The networks that were joined, in their order; one that was joined again stands there again.
    const std::vector<std::string>& joined() const { return m_joined; }

private:
    using Sentences = std::vector<std::string>;
    using Teller = Sentences (HotspotNarrator::*)(const Json::Value& payload);
    struct Entry;
    static const Entry* entryOf(const std::string& event);

    Sentences tellNetworks(const Json::Value& payload);
    Sentences tellCredentials(const Json::Value& payload);
    Sentences tellRadio(const Json::Value& payload);
    Sentences tellSwitch(const Json::Value& payload);
    Sentences tellCardIn(const Json::Value& payload);
    Sentences tellCardOut(const Json::Value& payload);
    Sentences tellResult(const Json::Value& payload);
    Sentences tellInternet(const Json::Value& payload);
    Sentences tellDetected(const Json::Value& payload);
    Sentences tellModuleState(const Json::Value& payload);

    Sentences firstNetworks() const;
    Sentences newNetworks(const NetworkList& before);
    std::string withCredential(const Network& network) const;

    Method m_method;
    NetworkList m_networks;
    CredentialList m_credentials;
    bool m_hasNetworks = false;
    bool m_hasCredentials = false;
    bool m_isResultOpen = false;
    std::optional<bool> m_isCardIn;
    std::optional<bool> m_isRadioOn;
    std::optional<bool> m_hasInternet;
    std::vector<std::string> m_joined;
    std::vector<const char*> m_questions;
};

}  // namespace vexa::client
