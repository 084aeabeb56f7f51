#include "hotspotport/CredentialCommands.h"

#include <limits>

#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "config/Config.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "hotspotport/CredentialInputReader.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

namespace {

using platform::LockGuard;

void addToTable(Supplicant& supplicant, const CredentialInput& input) REQUIRES(g_hs20Lock) {
    Log(3, "Adding a new credential...");
    if (supplicant.m_pMgr == nullptr) return;
    Config& config = supplicant.m_pMgr->config();
    std::int32_t id = -1;
    const int result = config.credentials().addCredential(input, config.nextCredId(), config.userName(), id);
    if (result != kSuccess || id <= 0) return;
    config.advanceNextCredId();
    config.saveConfig();
    supplicant.m_blockedNetworks.onCredentialAdded(id, config.credentials(), supplicant.m_networkList);
    supplicant.m_hCredentialChangedEvent.set();
}

}  // namespace

bool addCredential(SAHotSpotPortlink& server, const Json::Value& data) {
    const auto input = readCredentialInput(data);
    if (!input) return false;
    const auto supplicant = hotspotSupplicant(server);
    if (!supplicant) return true;
    const LockGuard lock(g_hs20Lock);
    addToTable(*supplicant, *input);
    return true;
}

bool deleteCredential(SAHotSpotPortlink& server, const Json::Value& data) {
    const auto id = readInteger(data, "Id");
    if (!id) return false;
    const auto supplicant = hotspotSupplicant(server);
    if (!supplicant) return true;
    const LockGuard lock(g_hs20Lock);
    supplicant->deleteCredential(*id);
    return true;
}

bool editCredential(SAHotSpotPortlink& server, const Json::Value& data) {
    auto input = readCredentialInput(data);
    const auto id = readInteger(data, "Id");
    if (!input || !id) return false;
    input->id = *id;
    const auto supplicant = hotspotSupplicant(server);
    if (*id == 0 || !supplicant) return true;
    const LockGuard lock(g_hs20Lock);
    supplicant->updateCredential(*input);
    return true;
}

// The client counts from 0, priorities count from 1.
bool setCredentialPosition(SAHotSpotPortlink& server, const Json::Value& data) {
    const auto id = readInteger(data, "Id");
    const auto order = readInteger(data, "Order");
    if (!id || !order || *order == std::numeric_limits<std::int32_t>::max()) return false;
    const auto supplicant = hotspotSupplicant(server);
    if (*id <= 0 || !supplicant || supplicant->m_pMgr == nullptr) return true;
    const LockGuard lock(g_hs20Lock);
    Config& config = supplicant->m_pMgr->config();
    config.credentials().setCredentialPosition(*id, *order + 1);
    config.saveConfig();
    return true;
}

}  // namespace vexa
