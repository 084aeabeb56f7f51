#include "client/command/credential/CredentialSession.h"

#include "client/command/Output.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

CredentialSession::CredentialSession(const HotspotOptions& options)
    : m_options(options), m_number(options.port.find()) {
    connect();
}

void CredentialSession::connect() {
    m_store.reset();
    m_port.emplace(m_number, m_signals, m_options.limit());
    m_store.emplace(*m_port, m_options.port.machine());
}

// The first connection has heard what was answered to those before us; a new one hears only what comes now.
CredentialStore& CredentialSession::begin() {
    m_turn.emplace(m_number, m_signals, m_options.limit());
    connect();
    m_store->read();
    return *m_store;
}

void CredentialSession::report(const std::string& verb, const std::string& sentence,
                               const Credential& credential, std::size_t position) const {
    if (const auto& why = m_store->whyUnsaved())
        throw ClientError("kept in memory only: " + nameOf(credential) + " was " + verb + ", but " + *why);
    Json::Value object(Json::objectValue);
    object["done"] = verb;
    object["credential"] = credentialJson(credential, position, Passwords::Hidden);
    print(m_options, object, sentence);
}

}  // namespace vexa::client
