#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"

namespace vexa {

namespace {

using platform::LockGuard;

}  // namespace

const Credential* Supplicant::findCredential(std::int32_t id) {
    return id < 1 ? nullptr : m_engine.m_config.credentials().findCredentialById(id);
}

void Supplicant::addCredential(const CredentialInput& input) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "Adding a new credential...");
    Config& config = m_engine.m_config;
    const auto file = config.beginChange();
    std::int32_t id = -1;
    const ResultCode result =
        config.credentials().addCredential(input, config.nextCredId(), config.userName(), id);
    if (result != kSuccess || id <= 0) return;
    config.advanceNextCredId();
    config.saveConfig(file);
    m_engine.m_blockedNetworks.onCredentialAdded(id, config.credentials(), m_engine.m_networkList);
    m_engine.m_hCredentialChangedEvent.set();
}

ResultCode Supplicant::deleteCredential(std::int32_t id) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "Deleting the credential with id=%d", id);
    Config& config = m_engine.m_config;
    const auto file = config.beginChange();
    id = config.currentId(id);
    if (!config.credentials().deleteCredential(id)) return kFailure;
    config.saveConfig(file);
    m_engine.m_retryHelper.removeAllCredNumRetryEntries(id);
    m_engine.m_profileMgr.deleteProfilesOfCredential(id);
    m_engine.m_hCredentialChangedEvent.set();
    return kSuccess;
}

ResultCode Supplicant::updateCredential(CredentialInput input) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "Updating the credential with id=%d", input.id);
    Config& config = m_engine.m_config;
    const auto file = config.beginChange();
    input.id = config.currentId(input.id);
    const Credential* const credential = findCredential(input.id);
    if (credential == nullptr) {
        Log(6, "ERROR: Cannot find credential.");
        return kFailure;
    }
    if (!credential->m_bAutoConnect && input.autoConnect)
        m_engine.m_blockedNetworks.onCredentialAutoConnectChanged(input.id, config.credentials(),
                                                                  m_engine.m_networkList);
    if (config.credentials().updateCredential(input) != kSuccess) return kFailure;
    config.saveConfig(file);
    m_engine.m_retryHelper.resetNumRetries(input.id);
    m_engine.m_profileMgr.deleteProfilesOfCredential(input.id);
    m_engine.m_hCredentialChangedEvent.set();
    return kSuccess;
}

void Supplicant::setCredentialPosition(std::int32_t id, std::int32_t position) {
    const LockGuard lock(g_hs20Lock);
    Config& config = m_engine.m_config;
    const auto file = config.beginChange();
    config.credentials().setCredentialPosition(config.currentId(id), position);
    config.saveConfig(file);
}

}  // namespace vexa
